#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <tuple>

#include "image_processing/dupe/quantiles.h"

namespace pelorin::image_processing {
namespace {

constexpr std::size_t entries = std::tuple_size_v<Quantiles>;
constexpr float last = static_cast<float>(entries - 1);

/// Whether `v` rises from 0 or more to a number of ordinary size, as the distribution of every photo
/// with a pixel does.
bool rises(const Quantiles& v) {
  constexpr float largest = std::numeric_limits<float>::max(), smallest = 1e-30f;
  int falls = 0;
  for (std::size_t i = 1; i < entries; ++i) falls |= v[i] >= v[i - 1] ? 0 : 1;
  return falls == 0 && v[0] >= 0.0f && v[entries - 1] >= smallest && v[entries - 1] <= largest;
}

}  // namespace

// The definition takes at each level the first entry that is not below it. Which of its two loops
// goes on next is as good as random, and half of the time was lost on guessing it wrongly. Where the
// values rise, entry j is below all levels from one on: j + 1, written there, and the largest number
// so far say of every level how many entries are below.
void invert(const Quantiles& v, Quantiles& inverse) {
  if (!rises(v)) {
    invertScalar(v, inverse);
    return;
  }
  const float step = v[entries - 1] / last;
  const float levelsPerUnit = 1.0f / step;
  std::array<std::int32_t, entries> firstAbove;
  for (std::size_t j = 0; j < entries; ++j) {
    // Of so few levels the product is off by far less than one.
    const std::int32_t near = static_cast<std::int32_t>(v[j] * levelsPerUnit);
    const float level = static_cast<float>(near), next = static_cast<float>(near + 1);
    firstAbove[j] = near + (level * step <= v[j] ? 1 : 0) + (next * step <= v[j] ? 1 : 0);
  }
  std::array<std::int32_t, entries + 2> below{};
  for (std::size_t j = 0; j < entries; ++j) {
    below[static_cast<std::size_t>(firstAbove[j])] = static_cast<std::int32_t>(j + 1);
  }
  std::array<float, entries + 1> entryBefore;  // the first has none
  entryBefore[0] = 0.0f;
  std::copy(v.begin(), v.end(), entryBefore.begin() + 1);
  std::int32_t reached = 0;
  for (std::size_t i = 0; i + 1 < entries; ++i) {
    reached = std::max(reached, below[i]);
    const float target = static_cast<float>(static_cast<std::int32_t>(i)) * step;
    const float low = entryBefore[static_cast<std::size_t>(reached)];
    const float high = entryBefore[static_cast<std::size_t>(reached) + 1];
    const float place = static_cast<float>(reached - 1) + (target - low) / (high - low);
    inverse[i] = reached == 0 ? 0.0f : place;
  }
  inverse[entries - 1] = last;
}

}  // namespace pelorin::image_processing
