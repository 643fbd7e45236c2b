#pragma once

#include <string>
#include <vector>

namespace pelorin::photo {

/// A library that the engine or whole photos stand on.
struct LibraryVersion {
  std::string name;     ///< "libpng"
  std::string version;  ///< Of the one in use, where it can tell; else of the one compiled with.
};

/// All of them, by name.
std::vector<LibraryVersion> libraryVersions();

}  // namespace pelorin::photo
