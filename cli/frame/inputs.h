#pragma once

#include <filesystem>
#include <string>
#include <vector>

#include "cli/frame/shown_text.h"
#include "cli/frame/verb.h"

namespace pelorin::cli {

/// What the user named as inputs.
struct InputOptions {
  std::vector<std::string> names;
  bool recursive = false;
};

/// Adds the positional IN... and `-r` to a verb.
void addInputOptions(Verb verb, InputOptions& options);

/// "a JPEG or PNG file, or - (standard input)", for the help.
std::string aPhotoFile();

/// One file to work on.
struct Input {
  std::string path;                 ///< As given or found; "-" is standard input.
  std::filesystem::path subfolder;  ///< Where in the named folder it was found; mostly empty.

  bool isStandardInput() const { return path == "-"; }
  std::string shownName() const { return cli::shownName(path); }
};

/// The files behind the names, in order: a file stands for itself, a folder (only with `-r`) for
/// the files below it that are called like a photo in sorted order, `@list` for the names in the lines
/// of that file (`@-`: of standard input), `-` for standard input. Names that do not exist are
/// kept: reading them fails like that of any other file.
/// @throws UsageError for a folder without `-r`, an unreadable list, a second use of standard
///         input; std::filesystem::filesystem_error for an unreadable folder.
std::vector<Input> expandInputs(const InputOptions& options);

/// Whether the user named exactly one file, and no folder or list.
bool isSingleFile(const InputOptions& options, const std::vector<Input>& inputs);

}  // namespace pelorin::cli
