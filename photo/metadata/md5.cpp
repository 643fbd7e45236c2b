#include "photo/metadata/md5.h"

#include <algorithm>
#include <bit>
#include <cmath>

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

void Md5::add(std::span<const std::uint8_t> bytes) {
  while (!bytes.empty()) {
    const auto before = static_cast<std::size_t>(size_ % begun_.size());
    const std::size_t count = std::min(begun_.size() - before, bytes.size());
    std::copy_n(bytes.begin(), count, begun_.begin() + static_cast<std::ptrdiff_t>(before));
    if (before + count == begun_.size()) addBlock(state_, begun_.data());
    size_ += count;
    bytes = bytes.subspan(count);
  }
}

std::string Md5::hex() {
  // A one bit, zeros up to the end of a block, of which the length in bits is the last.
  const std::uint64_t bits = size_ * 8;
  std::array<std::uint8_t, 64> zeros = {};
  constexpr std::size_t lengthPlace = 56;
  zeros[0] = 0x80;
  const auto rest = static_cast<std::size_t>(size_ % zeros.size());
  add({zeros.data(), (rest < lengthPlace ? lengthPlace : lengthPlace + zeros.size()) - rest});
  std::array<std::uint8_t, 8> length;
  for (unsigned i = 0; i < 8; ++i) length[i] = static_cast<std::uint8_t>(bits >> 8 * i);
  add(length);

  std::string hex;
  for (const std::uint32_t word : state_) {
    for (unsigned i = 0; i < 4; ++i) {
      const unsigned byte = word >> 8 * i & 255;
      hex += "0123456789ABCDEF"[byte >> 4];
      hex += "0123456789ABCDEF"[byte & 15];
    }
  }
  return hex;
}

std::string md5Hex(std::string_view bytes) {
  Md5 sum;
  sum.add({reinterpret_cast<const std::uint8_t*>(bytes.data()), bytes.size()});
  return sum.hex();
}

}  // namespace pelorin::photo
