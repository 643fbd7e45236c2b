#include "photo/metadata/md5.h"

#include <array>
#include <bit>
#include <cmath>
#include <cstdint>
#include <cstring>

namespace pelorin::photo {
namespace {

using Words = std::array<std::uint32_t, 4>;

// The integer part of 2^32 |sin(i)|, i from 1 in radians.
std::array<std::uint32_t, 64> sineTable() {
  std::array<std::uint32_t, 64> table;
  for (std::size_t i = 0; i < table.size(); ++i) {
    table[i] = static_cast<std::uint32_t>(
        std::floor(4294967296.0 * std::fabs(std::sin(static_cast<double>(i + 1)))));
  }
  return table;
}

void addBlock(Words& state, const unsigned char* block) {
  static const std::array<std::uint32_t, 64> sines = sineTable();
  constexpr int shifts[4][4] = {{7, 12, 17, 22}, {5, 9, 14, 20}, {4, 11, 16, 23}, {6, 10, 15, 21}};
  std::array<std::uint32_t, 16> input;
  for (std::size_t i = 0; i < input.size(); ++i) {
    const unsigned char* at = block + 4 * i;
    input[i] = at[0] | at[1] << 8 | at[2] << 16 | static_cast<std::uint32_t>(at[3]) << 24;
  }
  auto [a, b, c, d] = state;
  for (unsigned i = 0; i < 64; ++i) {
    std::uint32_t mixed = 0;
    unsigned word = 0;
    switch (i / 16) {
      case 0:
        mixed = (b & c) | (~b & d), word = i;
        break;
      case 1:
        mixed = (d & b) | (~d & c), word = 5 * i + 1;
        break;
      case 2:
        mixed = b ^ c ^ d, word = 3 * i + 5;
        break;
      default:
        mixed = c ^ (b | ~d), word = 7 * i;
        break;
    }
    const std::uint32_t sum = a + mixed + sines[i] + input[word % 16];
    a = d, d = c, c = b;
    b += std::rotl(sum, shifts[i / 16][i % 4]);
  }
  state = {state[0] + a, state[1] + b, state[2] + c, state[3] + d};
}

}  // namespace

std::string md5Hex(std::string_view bytes) {
  Words state = {0x67452301, 0xefcdab89, 0x98badcfe, 0x10325476};
  const auto* data = reinterpret_cast<const unsigned char*>(bytes.data());
  std::size_t done = 0;
  for (; bytes.size() - done >= 64; done += 64) addBlock(state, data + done);
  // The rest, a one bit, zeros, and the length in bits: one block or two.
  std::array<unsigned char, 128> last = {};
  const std::size_t rest = bytes.size() - done;
  if (rest > 0) std::memcpy(last.data(), data + done, rest);
  last[rest] = 0x80;
  const std::size_t blocks = rest < 56 ? 1 : 2;
  const std::uint64_t bits = std::uint64_t{bytes.size()} * 8;
  for (unsigned i = 0; i < 8; ++i)
    last[64 * blocks - 8 + i] = static_cast<unsigned char>(bits >> 8 * i);
  for (std::size_t i = 0; i < blocks; ++i) addBlock(state, last.data() + 64 * i);

  std::string hex;
  for (const std::uint32_t word : state) {
    for (unsigned i = 0; i < 4; ++i) {
      const unsigned byte = word >> 8 * i & 255;
      hex += "0123456789ABCDEF"[byte >> 4];
      hex += "0123456789ABCDEF"[byte & 15];
    }
  }
  return hex;
}

}  // namespace pelorin::photo
