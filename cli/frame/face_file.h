#pragma once

#include <map>
#include <string>
#include <vector>

#include "cli/frame/faces.h"

namespace pelorin::cli {

/// The faces that a JSON file tells: `{"faces": [{"left": 0.4, "top": 0.1, "right": 0.6, "bottom":
/// 0.4}]}`, in fractions of the upright picture, each with a "name" or without; or a list of such
/// objects, each with the "file" that it is about. `quenby info --json` prints both.
struct FaceFile {
  std::string path;
  bool isList = false;
  std::vector<Face> ofEveryPhoto;                     ///< When it is no list.
  std::map<std::string, std::vector<Face>> ofPhotos;  ///< By path, when it is.

  /// Of one photo.
  /// @throws FileError when a list has nothing about it.
  const std::vector<Face>& of(const std::string& photo) const;
};

/// @throws UsageError that says where in the file something is wrong.
FaceFile readFaceFile(const std::string& path);

}  // namespace pelorin::cli
