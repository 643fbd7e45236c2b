#pragma once

#include <cstddef>
#include <vector>

#include "photo/collection/pair_search.h"

namespace pelorin::photo {

/// Photos of which every two are a pair.
struct DupeGroup {
  std::vector<std::size_t> photos;  ///< Ascending, at least two.
  std::vector<ShotPair> pairs;      ///< The pairs among them, in the given order.
};

/// The groups that `pairs` make of `photoCount` photos, by their first photo: each photo stays in one,
/// the pairs with the highest scores come together first, and a pair whose groups cannot be joined
/// whole is in none.
std::vector<DupeGroup> groupWholly(std::size_t photoCount, const std::vector<ShotPair>& pairs);

}  // namespace pelorin::photo
