#include "cli/frame/inputs.h"

#include <fcntl.h>
#include <fnmatch.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <string_view>
#include <system_error>
#include <utility>

#include "cli/frame/errors.h"
#include "cli/frame/file_bytes.h"
#include "cli/frame/interrupt.h"
#include "cli/frame/limits.h"
#include "photo/format.h"

namespace fs = std::filesystem;

namespace pelorin::cli {
namespace {

std::string explainCode(std::error_code code) {
  return explain(std::system_error(code));
}

bool isNamedLikeAPhoto(const fs::path& path) {
  return photo::isPictureExtension(path.extension().string());
}

// What systems put beside photos: ".thumbnails", "._IMG_1.jpg", "@eaDir".
bool isHidden(const std::string& name) {
  return name.starts_with('.') || name == "@eaDir";
}

bool matches(const std::string& glob, const std::string& name, const std::string& path) {
  const bool meansPath = glob.find('/') != std::string::npos;
  return fnmatch(glob.c_str(), meansPath ? path.c_str() : name.c_str(), FNM_PATHNAME) == 0;
}

// Empty for an ordinary file.
std::string troubleOf(const fs::directory_entry& entry) {
  std::error_code failed;
  const fs::file_status status = entry.status(failed);
  switch (status.type()) {
    case fs::file_type::regular:
      break;
    case fs::file_type::not_found:
      return entry.is_symlink(failed) ? "is a link to nothing" : "is gone";
    case fs::file_type::fifo:
      return "is a pipe, not a file; name it to read from it";
    case fs::file_type::socket:
      return "is a socket, not a file";
    case fs::file_type::block:
    case fs::file_type::character:
      return "is a device, not a file";
    default:
      if (failed) return explainCode(failed);
  }
  return inputNamed(entry.path().string()).trouble;
}

class Walk {
 public:
  Walk(const InputOptions& options, const fs::path& folder) : options_(options), folder_(folder) {
    goThrough(folder);
    std::sort(found_.begin(), found_.end(),
              [](const Input& a, const Input& b) { return fs::path(a.path) < fs::path(b.path); });
  }

  std::vector<Input> take() { return std::move(found_); }

 private:
  void goThrough(const fs::path& folder) {
    std::error_code failed;
    fs::directory_iterator entry(folder, failed);
    for (; !failed && entry != fs::directory_iterator(); entry.increment(failed)) {
      stopIfInterrupted();
      if (!isLeftOut(entry->path())) look(*entry);
    }
    if (failed) add(folder, "cannot be read: " + explainCode(failed));
  }

  void look(const fs::directory_entry& entry) {
    std::error_code ignored;
    if (entry.is_directory(ignored)) {
      if (!entry.is_symlink(ignored)) goThrough(entry.path());
    } else if (isNamedLikeAPhoto(entry.path())) {
      add(entry.path(), troubleOf(entry));
    }
  }

  bool isLeftOut(const fs::path& path) const {
    const std::string name = path.filename().string();
    if (!options_.hidden && isHidden(name)) return true;
    const std::string below = path.lexically_relative(folder_).string();
    return std::ranges::any_of(options_.excluded,
                               [&](const std::string& glob) { return matches(glob, name, below); });
  }

  void add(const fs::path& path, std::string trouble) {
    fs::path subfolder = path.parent_path().lexically_relative(folder_);
    if (subfolder == ".") subfolder.clear();
    found_.push_back({path.string(), std::move(subfolder), std::move(trouble), /*found=*/true});
  }

  const InputOptions& options_;
  const fs::path folder_;
  std::vector<Input> found_;
};

class Expansion {
 public:
  explicit Expansion(const InputOptions& options) : options_(options) {}

  void addName(const std::string& name) {
    if (name.size() > 1 && name[0] == '@') {
      addList(name.substr(1), "the path after '@'");
    } else {
      addFileOrFolder(name);
    }
  }

  void addList(const std::string& list, const std::string& place) {
    if (list == "-") useStandardInput();
    std::vector<std::uint8_t> bytes;
    try {
      bytes = readInput({list, {}});
    } catch (const std::system_error&) {
      throw UsageError(list + ": cannot be read as a list of files; check " + place);
    }
    const std::string_view text(reinterpret_cast<const char*>(bytes.data()), bytes.size());
    const bool lines = text.find('\0') == std::string_view::npos;
    for (std::size_t start = 0; start < text.size();) {
      const std::size_t end = std::min(text.find(lines ? '\n' : '\0', start), text.size());
      std::string_view name = text.substr(start, end - start);
      if (lines && name.ends_with('\r')) name.remove_suffix(1);
      if (!name.empty()) addFileOrFolder(std::string(name));
      start = end + 1;
    }
  }

  std::vector<Input> inputs;

 private:
  void addFileOrFolder(const std::string& name) {
    if (name.empty()) throw UsageError("an input has an empty name");
    std::error_code ignored;
    if (name == "-") {
      useStandardInput();
      inputs.push_back({name, {}});
    } else if (fs::is_directory(name, ignored)) {
      if (!options_.recursive) {
        throw UsageError(name + ": is a folder; add -r to take the photos in it");
      }
      for (Input& input : Walk(options_, name).take()) inputs.push_back(std::move(input));
    } else if (!isExcluded(name)) {
      inputs.push_back(inputNamed(name));
    }
  }

  bool isExcluded(const std::string& name) const {
    return std::ranges::any_of(options_.excluded, [&](const std::string& glob) {
      return matches(glob, fs::path(name).filename().string(), name);
    });
  }

  void useStandardInput() {
    if (standardInputUsed_) throw UsageError("standard input can be named only once");
    standardInputUsed_ = true;
  }

  const InputOptions& options_;
  bool standardInputUsed_ = false;
};

}  // namespace

void addInputOptions(Verb verb, InputOptions& options) {
  verb.option("IN", options.names,
              photo::pictureFormats() +
                  " files, folders (with -r), @LIST (names of files, one a line or each ended by "
                  "a NUL), - (standard input)")
      .type("")
      .group("Input");
  verb.option("--files-from", options.lists,
              "Take the files named in this one too, or on standard input (-); may be repeated")
      .oneValueEach()
      .type("FILE")
      .group("Input");
  verb.flag("-r,--recursive", options.recursive,
            "Take the " + photo::pictureExtensions() + " files below a folder, in sorted order")
      .group("Input");
  verb.flag("--hidden", options.hidden,
            "With -r: also those whose names begin with a dot or that stand in such folders or in "
            "@eaDir")
      .group("Input");
  verb.option("--exclude", options.excluded,
              "Leave out files and folders so called; with a / in it, those with such a path below "
              "the folder given; may be repeated")
      .oneValueEach()
      .type("GLOB")
      .group("Input");
  addLimitOptions(verb);
}

std::string aPhotoFile() {
  return "a " + photo::pictureFormats() + " file, or - (standard input)";
}

Input inputNamed(const std::string& name) {
  Input input = {name, {}};
  if (!input.isStandardInput() && ::faccessat(AT_FDCWD, name.c_str(), R_OK, AT_EACCESS) != 0) {
    input.trouble = explainCode({errno, std::generic_category()});
  }
  return input;
}

std::vector<Input> expandInputs(const InputOptions& options) {
  if (options.names.empty() && options.lists.empty()) {
    throw UsageError("name the photos, or a list of them with --files-from");
  }
  Expansion expansion(options);
  for (const std::string& name : options.names) expansion.addName(name);
  for (const std::string& list : options.lists) expansion.addList(list, "--files-from");
  return std::move(expansion.inputs);
}

std::vector<std::string> listsOf(const InputOptions& options) {
  std::vector<std::string> lists = options.lists;
  for (const std::string& name : options.names) {
    if (name.starts_with('@')) lists.push_back(name.substr(1));
  }
  return lists;
}

bool isSingleFile(const InputOptions& options, const std::vector<Input>& inputs) {
  return options.lists.empty() && options.names.size() == 1 && inputs.size() == 1 &&
         inputs[0].path == options.names[0];
}

}  // namespace pelorin::cli
