#pragma once

#include <string>
#include <vector>

#include "cli/frame/comparison.h"
#include "photo/metadata/loss.h"

namespace pelorin::cli {

/// A photo on the page: its name, what became of it, and how it looks.
struct ComparedPhoto {
  std::string input;        ///< Its path.
  std::string output = {};  ///< The path of the result; empty without one.
  std::string remark = {};  ///< One clause, such as why it failed; mostly empty.
  const Comparison* pictures = nullptr;
  std::vector<photo::Loss> lost = {};
};

/// The part of the page that a photo has.
std::string comparisonSection(const ComparedPhoto& photo);

/// Before and after as one page that needs no other file and no network: every photo with a divider
/// between both, which mouse, fingers and keys move.
/// @param summary   one line, what was done with all of them.
/// @param sections  of all photos, one after the other.
std::string comparisonPage(const std::string& summary, const std::vector<std::string>& sections);

}  // namespace pelorin::cli
