#include "photo/collection/grouping.h"

#include <algorithm>
#include <numeric>

namespace pelorin::photo {
namespace {

// Disjoint sets; the first photo of a set stands for it.
class Sets {
 public:
  explicit Sets(std::size_t count) : parent_(count) {
    std::iota(parent_.begin(), parent_.end(), std::size_t{0});
  }

  std::size_t of(std::size_t photo) {
    while (parent_[photo] != photo) photo = parent_[photo] = parent_[parent_[photo]];
    return photo;
  }

  void join(std::size_t a, std::size_t b) {
    const auto [first, second] = std::minmax({of(a), of(b)});
    parent_[second] = first;
  }

 private:
  std::vector<std::size_t> parent_;
};

}  // namespace

std::vector<DupeGroup> groupPairs(std::size_t photoCount, const std::vector<ShotPair>& pairs) {
  Sets sets(photoCount);
  for (const ShotPair& pair : pairs) sets.join(pair.first, pair.second);

  constexpr std::size_t none = -1;
  std::vector<std::size_t> groupOf(photoCount, none);  // by the set's first photo
  std::vector<DupeGroup> groups;
  for (std::size_t photo = 0; photo < photoCount; ++photo) {
    const std::size_t first = sets.of(photo);
    if (first == photo) continue;
    if (groupOf[first] == none) {
      groupOf[first] = groups.size();
      groups.push_back({{first}, {}});
    }
    groups[groupOf[first]].photos.push_back(photo);
  }
  for (const ShotPair& pair : pairs) groups[groupOf[sets.of(pair.first)]].pairs.push_back(pair);
  std::sort(groups.begin(), groups.end(), [](const DupeGroup& a, const DupeGroup& b) {
    return a.photos.front() < b.photos.front();
  });
  return groups;
}

}  // namespace pelorin::photo
