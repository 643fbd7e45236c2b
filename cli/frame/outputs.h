#pragma once

#include <filesystem>
#include <map>
#include <string>
#include <vector>

#include "cli/frame/inputs.h"
#include "cli/frame/verb.h"

namespace pelorin::cli {

/// Where results go, as the user said it.
struct OutputOptions {
  std::string output;  ///< `-o`: a file, a folder, "-", or empty.
  std::string name;    ///< `--name`: how files in a folder are called.
  bool overwrite = false;
  bool planOnly = false;
  bool inPlace = false;  ///< Each result replaces its input, which `backup` keeps.
  bool noBackup = false;
  std::string backup;  ///< A folder.
  std::string times;   ///< "keep", "now", or empty for what is usual.

  /// Whether results have the times of their photos.
  bool keepsTimes() const { return times.empty() ? inPlace : times == "keep"; }
};

/// Adds `-o`, `--name`, `--overwrite` and `-n` to a verb.
/// @param defaultName   used when `--name` is not given, for example "{stem}_{filter}.jpg".
/// @param placeholders  what `--name` may hold in braces, for the help: "{stem}, {filter}".
void addOutputOptions(Verb verb, OutputOptions& options, const std::string& defaultName,
                      const std::string& placeholders);

/// Adds `--in-place`, `--backup` and `--no-backup`.
void addInPlaceOptions(Verb verb, OutputOptions& options);

/// @throws UsageError where the options contradict one another.
void checkInPlace(const OutputOptions& options, const std::vector<Input>& inputs);

/// One input and the file it becomes.
struct PlannedFile {
  Input input;
  std::string output;        ///< "-" is standard output.
  bool skipped;              ///< There already, and not to be replaced (again).
  std::string earlier = {};  ///< The same edit, where a plan knows that the photo carries its mark.
};

/// Says for every input which file it becomes, before any work. In a folder a result is called
/// after `name`, whose {stem} is the input's name without its extension, whose {ext}
/// is the usual extension of the input's format ("jpg" where it has none) and whose other
/// placeholders are `values`; below it stand the input's own sub-folders.
/// @param named  what the user typed as inputs: several, a folder or a list go into a folder.
///
/// `-o` names a folder, which need not exist, where it ends in a slash or where there may be several
/// inputs. Where results stand beside photos, those that are results of others are left out; with
/// `--overwrite` only where they were not named.
/// @throws UsageError when two inputs would become one file, when a result would replace an input
///         (its own is allowed with `--overwrite`), when the folder of a single file is missing, and
///         for a name that is no file name or has an unknown placeholder.
std::vector<PlannedFile> planOutputs(const std::vector<Input>& inputs, const InputOptions& named,
                                     const OutputOptions& options,
                                     const std::map<std::string, std::string>& values);

/// The folders that a plan needs: made at once, freed from what killed runs left in them, and those
/// of them that were made and stayed empty removed at the end.
class OutputFolders {
 public:
  /// @param page  another file that is written beside the results; may be empty.
  /// @throws std::filesystem::filesystem_error when one cannot be made.
  explicit OutputFolders(const std::vector<PlannedFile>& plan, const std::string& page = "");
  explicit OutputFolders(const std::vector<std::string>& outputs);
  ~OutputFolders();
  OutputFolders(const OutputFolders&) = delete;
  OutputFolders& operator=(const OutputFolders&) = delete;

 private:
  void make(const std::filesystem::path& folder);
  std::vector<std::filesystem::path> made_;  // parents before children
};

}  // namespace pelorin::cli
