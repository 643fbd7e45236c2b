#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>

namespace pelorin::photo {

/// An MD5 sum of bytes that come in pieces (RFC 1321). No protection against anyone.
class Md5 {
 public:
  void add(std::span<const std::uint8_t> bytes);

  /// The sum of all that was added, in 32 upper-case hexadecimal digits; nothing is added afterwards.
  std::string hex();

 private:
  std::array<std::uint32_t, 4> state_ = {0x67452301, 0xefcdab89, 0x98badcfe, 0x10325476};
  std::array<std::uint8_t, 64> begun_ = {};  // a block that waits for its end
  std::uint64_t size_ = 0;                   // of all bytes
};

/// The MD5 sum of some bytes in 32 upper-case hexadecimal digits, as Extended XMP names itself by it
/// (RFC 1321). No protection against anyone.
std::string md5Hex(std::string_view bytes);

}  // namespace pelorin::photo
