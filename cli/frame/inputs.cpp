#include "cli/frame/inputs.h"

#include <algorithm>
#include <fstream>
#include <iostream>

#include "cli/frame/errors.h"
#include "photo/format.h"

namespace fs = std::filesystem;

namespace pelorin::cli {
namespace {

bool isNamedLikeAPhoto(const fs::path& path) {
  return photo::isPictureExtension(path.extension().string());
}

void addFolder(const std::string& folder, std::vector<Input>& inputs) {
  std::vector<fs::path> photos;
  for (const fs::directory_entry& entry : fs::recursive_directory_iterator(folder)) {
    if (isNamedLikeAPhoto(entry.path()) && !entry.is_directory()) photos.push_back(entry.path());
  }
  std::sort(photos.begin(), photos.end());
  for (const fs::path& photo : photos) {
    inputs.push_back({photo.string(), photo.parent_path().lexically_relative(folder)});
    if (inputs.back().subfolder == ".") inputs.back().subfolder.clear();
  }
}

class Expansion {
 public:
  explicit Expansion(bool recursive) : recursive_(recursive) {}

  void addName(const std::string& name) {
    if (name.size() > 1 && name[0] == '@') {
      addList(name.substr(1));
    } else {
      addFileOrFolder(name);
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
    } else if (!fs::is_directory(name, ignored)) {
      inputs.push_back({name, {}});
    } else if (recursive_) {
      addFolder(name, inputs);
    } else {
      throw UsageError(name + ": is a folder; add -r to take the photos in it");
    }
  }

  void addList(const std::string& list) {
    if (list == "-") {
      useStandardInput();
      addLines(std::cin);
      return;
    }
    std::ifstream stream(list);
    std::error_code ignored;
    if (!stream || fs::is_directory(list, ignored)) {
      throw UsageError(list + ": cannot be read as a list of files; check the path after '@'");
    }
    addLines(stream);
  }

  void addLines(std::istream& stream) {
    for (std::string line; std::getline(stream, line);) {
      if (!line.empty() && line.back() == '\r') line.pop_back();
      if (!line.empty()) addFileOrFolder(line);
    }
  }

  void useStandardInput() {
    if (standardInputUsed_) throw UsageError("standard input can be named only once");
    standardInputUsed_ = true;
  }

  bool recursive_;
  bool standardInputUsed_ = false;
};

}  // namespace

void addInputOptions(Verb verb, InputOptions& options) {
  verb.option("IN", options.names,
              photo::pictureFormats() +
                  " files, folders (with -r), @LIST (one name a line), - (standard input)")
      .required()
      .type("")
      .group("Input");
  verb.flag("-r,--recursive", options.recursive,
            "Take the " + photo::pictureExtensions() + " files below a folder, in sorted order")
      .group("Input");
}

std::string aPhotoFile() {
  return "a " + photo::pictureFormats() + " file, or - (standard input)";
}

std::vector<Input> expandInputs(const InputOptions& options) {
  Expansion expansion(options.recursive);
  for (const std::string& name : options.names) expansion.addName(name);
  return std::move(expansion.inputs);
}

bool isSingleFile(const InputOptions& options, const std::vector<Input>& inputs) {
  return options.names.size() == 1 && inputs.size() == 1 && inputs[0].path == options.names[0];
}

}  // namespace pelorin::cli
