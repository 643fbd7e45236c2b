#pragma once

#include <map>
#include <string>
#include <vector>

#include "cli/frame/inputs.h"

namespace pelorin::cli {

/// The files that a run reads or has named, by what they are: two paths mean the same file when they
/// are one name in one folder, or one file without other names, whatever links lie between.
/// Standard streams and special files (/dev/null, a pipe) are none.
class UsedFiles {
 public:
  /// Adds a file, which need not exist, and what it is: "an input". Of the same, the first stays.
  void add(const std::string& path, const std::string& what);

  /// What the file was when it was added, or null when it was not.
  const std::string* find(const std::string& path) const;

 private:
  std::map<std::string, std::string> all_;
};

/// The inputs, each as "an input".
UsedFiles usedFiles(const std::vector<Input>& inputs);

/// Refuses outputs that are one of the files `used`, or of which two are the same file.
/// @throws UsageError.
void refuseSharedFiles(const std::vector<std::string>& outputs, UsedFiles used);

/// Removes what killed runs left in the folders of these outputs.
void sweepFolders(const std::vector<std::string>& outputs);

}  // namespace pelorin::cli
