#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

/// What is good, with up to four of its bytes changed as `damage` says: two bytes for the place, one
/// for the value.
inline std::string damaged(std::string good, const std::vector<std::uint8_t>& damage) {
  constexpr std::size_t most = 12;
  for (std::size_t i = 0; i + 2 < std::min(damage.size(), most); i += 3) {
    const std::size_t place = std::size_t{damage[i]} << 8 | damage[i + 1];
    good[place % good.size()] = static_cast<char>(damage[i + 2]);
  }
  return good;
}
