#include "cli/frame/nearest_name.h"

#include <algorithm>
#include <cctype>
#include <limits>
#include <numeric>

namespace pelorin::cli {
namespace {

int lower(char letter) {
  return std::tolower(static_cast<unsigned char>(letter));
}

int changeCost(char from, char to) {
  if (from == to) return 0;
  return lower(from) == lower(to) ? 1 : 2;
}

// Levenshtein's distance, in half changes.
int distance(const std::string& from, const std::string& to) {
  std::vector<int> row(to.size() + 1);
  for (std::size_t j = 0; j < row.size(); ++j) row[j] = static_cast<int>(2 * j);
  for (std::size_t i = 0; i < from.size(); ++i) {
    int diagonal = row[0];
    row[0] += 2;
    for (std::size_t j = 0; j < to.size(); ++j) {
      const int changed = diagonal + changeCost(from[i], to[j]);
      diagonal = row[j + 1];
      row[j + 1] = std::min({changed, row[j] + 2, row[j + 1] + 2});
    }
  }
  return row.back();
}

}  // namespace

std::string nearestName(const std::string& name, const std::vector<std::string>& candidates) {
  std::string nearest;
  int least = std::numeric_limits<int>::max();
  for (const std::string& candidate : candidates) {
    const int changes = distance(name, candidate);
    const bool isNear = changes < static_cast<int>(std::max(name.size(), candidate.size()));
    if (isNear && changes < least) {
      least = changes;
      nearest = candidate;
    }
  }
  return nearest;
}

std::string unknownName(const std::string& kind, const std::string& name,
                        const std::vector<std::string>& candidates) {
  const std::string nearest = nearestName(name, candidates);
  const std::string unknown = "unknown " + kind + " '" + name + "'";
  return nearest.empty() ? unknown : unknown + "; did you mean '" + nearest + "'?";
}

}  // namespace pelorin::cli
