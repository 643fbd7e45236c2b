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
  std::vector<std::string> lists = {};  ///< Of `--files-from`.
  bool hidden = false;
  std::vector<std::string> excluded = {};  ///< Globs.
};

/// Adds the positional IN..., `--files-from`, `-r`, `--hidden`, `--exclude` and the limits to a verb.
void addInputOptions(Verb verb, InputOptions& options);

/// "a JPEG or PNG file, or - (standard input)", for the help.
std::string aPhotoFile();

/// One file to work on.
struct Input {
  std::string path;                 ///< As given or found; "-" is standard input.
  std::filesystem::path subfolder;  ///< Where in the named folder it was found; mostly empty.
  std::string trouble = {};         ///< Why it cannot be worked on, when that is known already.
  bool found = false;               ///< Below a folder, not named.

  bool isStandardInput() const { return path == "-"; }
  std::string shownName() const { return cli::shownName(path); }
};

/// The input that a name stands for; with its trouble, when there is no such file or when it may not
/// be read.
Input inputNamed(const std::string& name);

/// The files behind the names, in order: a file stands for itself, a folder (only with `-r`) for
/// the files below it that are called like a photo in sorted order, `@list` for the names in that
/// file (`@-`: of standard input), which are lines or, when the file holds a NUL, end with one each,
/// `-` for standard input. What cannot be worked on is among them, with its trouble: names that
/// mean no file, and below folders those that cannot be opened, pipes and devices that are called
/// like a photo, links to nothing.
/// @throws UsageError for a folder without `-r`, an unreadable list, a second use of standard
///         input, and where nothing was named; Interrupted on Ctrl-C.
std::vector<Input> expandInputs(const InputOptions& options);

/// The files of names among them, of `@list` and `--files-from`.
std::vector<std::string> listsOf(const InputOptions& options);

/// Whether the user named exactly one file, and no folder or list.
bool isSingleFile(const InputOptions& options, const std::vector<Input>& inputs);

}  // namespace pelorin::cli
