#include "tests/support/fingerprint.h"

#include <cinttypes>
#include <cstdint>
#include <cstdio>

namespace pelorin::test_support {

std::string fingerprint(const void* bytes, std::size_t count) {
  const unsigned char* byte = static_cast<const unsigned char*>(bytes);
  std::uint64_t hash = 0xCBF29CE484222325u;
  for (std::size_t i = 0; i < count; ++i) hash = (hash ^ byte[i]) * 0x100000001B3u;
  char digits[17];
  std::snprintf(digits, sizeof digits, "%016" PRIx64, hash);
  return digits;
}

}  // namespace pelorin::test_support
