#include "photo/collection/grouping.h"

#include <algorithm>
#include <iterator>
#include <numeric>
#include <utility>

namespace pelorin::photo {
namespace {

// The groups of `members`, sets of photos in ascending order, with the pairs inside them.
std::vector<DupeGroup> groupsOf(std::size_t photoCount,
                                std::vector<std::vector<std::size_t>> members,
                                const std::vector<ShotPair>& pairs) {
  std::erase_if(members, [](const auto& photos) { return photos.size() < 2; });
  std::sort(members.begin(), members.end());
  constexpr std::size_t none = -1;
  std::vector<std::size_t> groupOf(photoCount, none);
  std::vector<DupeGroup> groups;
  for (std::vector<std::size_t>& photos : members) {
    for (const std::size_t photo : photos) groupOf[photo] = groups.size();
    groups.push_back({std::move(photos), {}});
  }
  for (const ShotPair& pair : pairs) {
    const std::size_t group = groupOf[pair.first];
    if (group != none && group == groupOf[pair.second]) groups[group].pairs.push_back(pair);
  }
  return groups;
}

}  // namespace

std::vector<DupeGroup> groupWholly(std::size_t photoCount, const std::vector<ShotPair>& pairs) {
  std::vector<std::vector<std::size_t>> partners(photoCount);  // ascending
  for (const ShotPair& pair : pairs) {
    partners[pair.first].push_back(pair.second);
    partners[pair.second].push_back(pair.first);
  }
  for (std::vector<std::size_t>& photos : partners) std::sort(photos.begin(), photos.end());
  std::vector<const ShotPair*> byScore;
  for (const ShotPair& pair : pairs) byScore.push_back(&pair);
  std::sort(byScore.begin(), byScore.end(), [](const ShotPair* a, const ShotPair* b) {
    return a->score != b->score ? a->score > b->score : a < b;
  });

  std::vector<std::size_t> groupOf(photoCount);
  std::iota(groupOf.begin(), groupOf.end(), std::size_t{0});
  std::vector<std::vector<std::size_t>> members(photoCount);
  for (std::size_t photo = 0; photo < photoCount; ++photo) members[photo] = {photo};
  const auto isWhole = [&](const std::vector<std::size_t>& a, const std::vector<std::size_t>& b) {
    return std::all_of(a.begin(), a.end(), [&](std::size_t photo) {
      return std::includes(partners[photo].begin(), partners[photo].end(), b.begin(), b.end());
    });
  };
  for (const ShotPair* pair : byScore) {
    const auto [first, second] = std::minmax({groupOf[pair->first], groupOf[pair->second]});
    if (first == second || !isWhole(members[first], members[second])) continue;
    for (const std::size_t photo : members[second]) groupOf[photo] = first;
    std::vector<std::size_t> joined;
    std::merge(members[first].begin(), members[first].end(), members[second].begin(),
               members[second].end(), std::back_inserter(joined));
    members[first] = std::move(joined);
    members[second].clear();
  }
  return groupsOf(photoCount, std::move(members), pairs);
}

}  // namespace pelorin::photo
