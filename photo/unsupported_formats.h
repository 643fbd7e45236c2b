#pragma once

#include <cstdint>
#include <span>
#include <string_view>

namespace pelorin::photo {

/// A kind of photo that is known by its content and cannot be read.
struct UnsupportedFormat {
  std::string_view name;        ///< "a HEIC photo"
  std::string_view conversion;  ///< A command that makes a JPEG file of it.
};

/// @returns null when the bytes are none of them.
const UnsupportedFormat* unsupportedFormatOf(std::span<const std::uint8_t> file);

}  // namespace pelorin::photo
