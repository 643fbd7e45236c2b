#pragma once

#include <string>

namespace pelorin::photo {

/// Something of a file that the file made of it does not have.
struct Loss {
  std::string what;  ///< "C2PA manifest"
  std::string why;   ///< One clause: "an edit breaks its signature".

  friend bool operator==(const Loss&, const Loss&) = default;
};

}  // namespace pelorin::photo
