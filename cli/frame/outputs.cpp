#include "cli/frame/outputs.h"

#include <algorithm>
#include <set>
#include <system_error>

#include "cli/frame/errors.h"
#include "cli/frame/nearest_name.h"
#include "cli/frame/used_files.h"
#include "photo/backup.h"
#include "photo/format.h"

namespace fs = std::filesystem;

namespace pelorin::cli {
namespace {

std::string fillIn(const std::string& name, const std::map<std::string, std::string>& values) {
  std::string filled;
  for (std::size_t at = 0; at < name.size();) {
    const std::size_t open = name.find('{', at);
    filled += name.substr(at, open - at);
    if (open == std::string::npos) break;
    const std::size_t close = name.find('}', open);
    if (close == std::string::npos) throw UsageError("--name: a '{' has no '}' in '" + name + "'");
    const std::string key = name.substr(open + 1, close - open - 1);
    const auto found = values.find(key);
    if (found == values.end()) {
      std::vector<std::string> keys;
      for (const auto& [known, value] : values) keys.push_back(known);
      throw UsageError("--name: " + unknownName("placeholder", key, keys));
    }
    filled += found->second;
    at = close + 1;
  }
  if (filled.empty() || filled == "." || filled == ".." || filled.find('/') != std::string::npos) {
    throw UsageError("--name: '" + filled + "' is not a file name");
  }
  return filled;
}

// Whether it is a folder; false when there is nothing.
bool isFolder(const fs::path& folder) {
  std::error_code failed, ignored;
  if (fs::is_directory(folder, failed)) return true;
  if (!fs::exists(folder, ignored)) return false;
  if (failed) throw std::system_error(failed, folder.string());
  throw UsageError(folder.string() + ": is not a folder; choose another output");
}

void requireFolder(const fs::path& folder) {
  if (isFolder(folder)) return;
  throw UsageError(folder.string() + ": there is no such folder; make it first (mkdir -p)");
}

std::string nameInFolder(const Input& input, const OutputOptions& options,
                         std::map<std::string, std::string> values) {
  const fs::path path = input.path;
  values["stem"] = input.isStandardInput() ? "stdin" : path.stem().string();
  const photo::Format* named = photo::formatWithExtension(path.extension().string());
  const photo::Format& format = named != nullptr ? *named : photo::usualFormat();
  values["ext"] = format.extensions[0].substr(1);
  const std::string name = fillIn(options.name, values);
  if (options.output.empty()) return (path.parent_path() / name).string();
  return (fs::path(options.output) / input.subfolder / name).string();
}

void refuseClashes(const std::vector<PlannedFile>& plan, const InputOptions& named,
                   bool overwrite) {
  UsedFiles inputs, outputs;
  for (const PlannedFile& file : plan) inputs.add(file.input.path, file.input.path);
  UsedFiles lists;
  for (const std::string& list : listsOf(named)) lists.add(list, list);
  for (const PlannedFile& file : plan) {
    if (!file.input.trouble.empty()) continue;
    const std::string* const other = outputs.find(file.output);
    if (other != nullptr) {
      throw UsageError(file.output + ": both " + *other + " and " + file.input.shownName() +
                       " would become this file; change --name");
    }
    outputs.add(file.output, file.input.shownName());
    if (lists.find(file.output) != nullptr) {
      throw UsageError(file.output + ": is the list of inputs; change --name or -o");
    }
    if (inputs.find(file.output) == nullptr) continue;
    UsedFiles own;
    own.add(file.input.path, file.input.path);
    if (own.find(file.output) == nullptr) {
      throw UsageError(file.output +
                       ": is itself an input and would be replaced by the result of " +
                       file.input.shownName() + "; change --name or -o");
    }
    if (!overwrite) {
      throw UsageError(file.output + ": is the input itself; add --overwrite to replace it");
    }
  }
}

void requireFolderOrNothing(const std::string& output, bool endsInSlash) {
  if (isFolder(output)) return;
  if (!endsInSlash && photo::isPictureExtension(fs::path(output).extension().string())) {
    throw UsageError(output + ": is called like one picture; several need a folder (" + output +
                     "/ would be one)");
  }
}

// A folder that was gone through before holds what was made then; "*.jpg" names it as well.
void leaveOutResults(std::vector<PlannedFile>& plan, bool overwrite) {
  std::set<std::string> results;
  for (const PlannedFile& file : plan) results.insert(file.output);
  std::erase_if(plan, [&](const PlannedFile& file) {
    return (file.input.found || !overwrite) && file.input.path != file.output &&
           results.contains(file.input.path);
  });
}

}  // namespace

void addOutputOptions(Verb verb, OutputOptions& options, const std::string& defaultName,
                      const std::string& placeholders) {
  verb.option("-o,--output", options.output,
              "A " + photo::pictureExtensions() +
                  " file, a folder (made where it is missing: end its name in / for a single "
                  "photo), or - (standard output); without it results stand beside their inputs, "
                  "called by --name")
      .type("FILE|DIR")
      .group("Output");
  verb.option("--name", options.name,
              "How results are called in a folder, from " + placeholders + "; " + defaultName +
                  " unless given")
      .type("PATTERN")
      .group("Output");
  verb.flag("--overwrite", options.overwrite, "Replace files that are there already")
      .group("Output");
  verb.flag("-n,--dry-run", options.planOnly, "Print what would become what, and do nothing")
      .group("Output");
}

void addInPlaceOptions(Verb verb, OutputOptions& options) {
  verb.flag("--in-place", options.inPlace,
            "Results replace their photos, in the format that these have whatever they are called; "
            "needs "
            "--backup or --no-backup")
      .group("Output");
  verb.option("--backup", options.backup,
              "Keep the replaced photos in this folder; quenby undo DIR puts them back, and photos "
              "that it has are not done again")
      .type("DIR")
      .group("Output");
  verb.flag("--no-backup", options.noBackup, "Replace photos for good").group("Output");
  verb.option("--times", options.times,
              "Whether results have the times of their photos (keep, usual for --in-place) or that "
              "of being written (now, usual elsewhere)")
      .oneOf({"keep", "now"})
      .group("Output");
}

void checkInPlace(const OutputOptions& options, const std::vector<Input>& inputs) {
  if (!options.inPlace) {
    if (options.noBackup || !options.backup.empty()) {
      throw UsageError("--backup and --no-backup are for --in-place");
    }
    return;
  }
  if (!options.output.empty() || !options.name.empty()) {
    throw UsageError("--in-place: results replace their photos; leave out -o and --name");
  }
  if (options.noBackup == !options.backup.empty()) {
    throw UsageError("--in-place: add --backup DIR to be able to undo it, or --no-backup");
  }
  std::error_code ignored;
  const fs::path kept = options.backup.empty() ? fs::path() : fs::weakly_canonical(options.backup);
  for (const Input& input : inputs) {
    if (input.isStandardInput()) throw UsageError("--in-place: standard input has no place");
    const fs::path below = fs::weakly_canonical(input.path, ignored).lexically_relative(kept);
    if (!kept.empty() && !below.empty() && *below.begin() != "..") {
      throw UsageError("--backup: " + input.path + " is in that folder; choose another one");
    }
  }
}

std::vector<PlannedFile> planOutputs(const std::vector<Input>& inputs, const InputOptions& named,
                                     const OutputOptions& options,
                                     const std::map<std::string, std::string>& values) {
  const std::string& output = options.output;
  const bool toStandardOutput = output == "-";
  std::error_code ignored;
  const bool oneFile = isSingleFile(named, inputs);
  const bool endsInSlash = output.ends_with('/');
  const bool intoFolder = output.empty() || (!oneFile && !toStandardOutput) || endsInSlash ||
                          fs::is_directory(output, ignored);

  if (toStandardOutput && !oneFile) throw UsageError("-o -: only one file fits standard output");
  if (intoFolder && !output.empty()) requireFolderOrNothing(output, endsInSlash);
  if (!intoFolder && !toStandardOutput) {
    const fs::path parent = fs::path(output).parent_path();
    if (!parent.empty()) requireFolder(parent);
  }

  std::vector<PlannedFile> plan;
  for (const Input& input : inputs) {
    if (options.inPlace) {
      const bool replaced = !options.backup.empty() && fs::exists(input.path, ignored) &&
                            photo::isReplaced(options.backup, input.path);
      plan.push_back({input, input.path, replaced});
      continue;
    }
    PlannedFile file = {input, intoFolder ? nameInFolder(input, options, values) : output, false};
    // Special files (/dev/null, a pipe) have nothing to lose.
    const fs::file_status status = fs::status(file.output, ignored);
    const bool exists = file.output != "-" && fs::exists(status) && !fs::is_other(status);
    file.skipped = exists && !options.overwrite;
    plan.push_back(std::move(file));
  }
  if (output.empty() && !options.inPlace) leaveOutResults(plan, options.overwrite);
  refuseClashes(plan, named, options.overwrite || options.inPlace);
  return plan;
}

namespace {

std::vector<std::string> outputsToMake(const std::vector<PlannedFile>& plan,
                                       const std::string& page) {
  std::vector<std::string> outputs;
  if (!page.empty()) outputs.push_back(page);
  for (const PlannedFile& file : plan) {
    if (!file.skipped && file.input.trouble.empty()) outputs.push_back(file.output);
  }
  return outputs;
}

}  // namespace

OutputFolders::OutputFolders(const std::vector<PlannedFile>& plan, const std::string& page)
    : OutputFolders(outputsToMake(plan, page)) {}

OutputFolders::OutputFolders(const std::vector<std::string>& outputs) {
  for (const std::string& output : outputs) {
    if (output != "-") make(fs::path(output).parent_path());
  }
  sweepFolders(outputs);
}

OutputFolders::~OutputFolders() {
  std::error_code ignored;
  for (auto folder = made_.rbegin(); folder != made_.rend(); ++folder) fs::remove(*folder, ignored);
}

void OutputFolders::make(const fs::path& folder) {
  if (folder.empty() || fs::is_directory(folder)) return;
  make(folder.parent_path());
  if (fs::create_directory(folder)) made_.push_back(folder);
}

}  // namespace pelorin::cli
