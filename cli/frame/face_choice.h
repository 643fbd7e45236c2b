#pragma once

#include <optional>
#include <string>
#include <vector>

#include "cli/frame/face_file.h"
#include "cli/frame/faces.h"
#include "cli/frame/inputs.h"
#include "cli/frame/verb.h"

namespace pelorin::cli {

/// What the user says of faces.
struct FaceOptions {
  std::vector<std::string> given;  ///< For `readFaces`.
  std::string source = "xmp";      ///< Of others: "xmp", "none" or a file for `readFaceFile`.
};

/// Adds `--face l,t,r,b`, repeatable, and `--faces`.
void addFaceOptions(Verb verb, FaceOptions& options);

/// Which faces a photo has.
class FaceChoice {
 public:
  /// @throws UsageError for texts and files that cannot be read.
  explicit FaceChoice(const FaceOptions& options);

  /// Whether the photo's own file is to be asked, for `OpenOptions`.
  bool asksPhoto() const { return asksPhoto_; }
  /// Whether the user named any, which would be in vain for a filter that reads none.
  bool areNamed() const { return !given_.empty() || file_; }

  /// Those that the user names, for `allFaces`.
  /// @throws FileError when a file of faces does not know the photo.
  std::vector<Face> of(const Input& input) const;

 private:
  std::vector<Face> given_;
  std::optional<FaceFile> file_;
  bool asksPhoto_;
};

}  // namespace pelorin::cli
