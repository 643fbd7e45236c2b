#pragma once

#include <string>
#include <string_view>

namespace pelorin::photo {

/// The MD5 sum of some bytes in 32 upper-case hexadecimal digits, as Extended XMP names itself by it
/// (RFC 1321). No protection against anyone.
std::string md5Hex(std::string_view bytes);

}  // namespace pelorin::photo
