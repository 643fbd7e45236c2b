#include "cli/frame/lone_files.h"

#include <fmt/format.h>

#include <filesystem>

#include "cli/frame/errors.h"
#include "cli/frame/limits.h"
#include "cli/frame/used_files.h"

namespace fs = std::filesystem;

namespace pelorin::cli {
namespace {

void requirePlaceFor(const std::string& path, bool makesFolder) {
  if (path == "-") return;
  std::error_code ignored;
  if (path.empty() || path.back() == '/' || fs::is_directory(path, ignored)) {
    throw UsageError(path + ": is a folder; name a file in it");
  }
  const fs::path folder = fs::path(path).parent_path();
  if (makesFolder && !fs::exists(folder, ignored)) return;
  if (!folder.empty() && !fs::is_directory(folder, ignored)) {
    throw UsageError(folder.string() + ": there is no such folder; make it first (mkdir -p)");
  }
}

/// Special files (/dev/null, a pipe) have nothing to lose.
bool holdsAFile(const std::string& path) {
  std::error_code ignored;
  const fs::file_status status = fs::status(path, ignored);
  return path != "-" && fs::exists(status) && !fs::is_other(status);
}

}  // namespace

void addLoneOutputOptions(Verb verb, LoneOutputOptions& options, const std::string& typeName,
                          const std::string& help) {
  verb.option("-o,--output", options.output, help).type(typeName).group("Output");
  verb.flag("--overwrite", options.overwrite, "Replace files that are there already")
      .group("Output");
  verb.flag("-n,--dry-run", options.planOnly, "Print what would become what, and do nothing")
      .group("Output");
}

void addLoneInput(Verb verb, std::string& name) {
  verb.option("IN", name, "A photo: " + aPhotoFile()).required();
  addLimitOptions(verb);
}

Input loneInput(const std::string& name) {
  std::error_code ignored;
  if (name.empty()) throw UsageError("the input has an empty name");
  if (fs::is_directory(name, ignored)) throw UsageError(name + ": is a folder; name one photo");
  return inputNamed(name);
}

std::optional<ExitCode> stopBeforeWork(const std::vector<Input>& inputs,
                                       const std::vector<std::string>& outputs,
                                       const LoneOutputOptions& options, Talk& talk,
                                       JsonOutput& json) {
  bool kept = false;
  refuseSharedFiles(outputs, usedFiles(inputs));
  for (const std::string& output : outputs) {
    requirePlaceFor(output, options.makesFolder);
    if (options.overwrite || !holdsAFile(output)) continue;
    talk.note(output + ": exists already; add --overwrite to replace it");
    kept = true;
  }
  if (!kept && !options.planOnly) {
    sweepFolders(outputs);
    return std::nullopt;
  }
  bool failed = false;
  for (const Input& input : inputs) {
    if (input.trouble.empty()) continue;
    failed = true;
    talk.error(input.shownName(), input.trouble);
  }
  Json plan = {{"inputs", Json::array()}, {"outputs", outputs}};
  plan["status"] = failed ? "failed" : kept ? "exists" : "planned";
  for (const Input& input : inputs) {
    plan["inputs"].push_back(input.path);
    if (kept || json.wanted() || !input.trouble.empty()) continue;
    for (const std::string& output : outputs) {
      fmt::print("{} -> {}\n", shownText(input.path), shownText(output));
    }
  }
  json.add(plan);
  if (failed) return ExitCode::someFailed;
  return kept ? ExitCode::nothingToDo : ExitCode::allDone;
}

}  // namespace pelorin::cli
