#pragma once

#include <string>
#include <vector>

#include "cli/frame/json_output.h"
#include "photo/collection/best_photo.h"
#include "photo/collection/grouping.h"
#include "photo/collection/scanned_photo.h"

namespace pelorin::cli {

/// What a search for duplicates has found.
struct DupeReport {
  float threshold;
  std::vector<ScannedPhoto> photos;
  std::vector<DupeGroup> groups;
  std::vector<FailedPhoto> failed;
  bool rank;  ///< Whether each group is ranked by what to keep.
};

/// One group in a few lines, for a terminal; `number` counts from 1.
std::string groupAsText(const DupeReport& report, const DupeGroup& group, std::size_t number);

/// One group as an object.
Json groupAsJson(const DupeReport& report, const DupeGroup& group);

/// A file that could not be read as an object.
Json failureAsJson(const FailedPhoto& failed);

/// "2 groups with 5 of 120 photos".
std::string summaryOf(const DupeReport& report);

/// "score 2.41, 0.8 s apart, distance 0.0123, same orientation"; says where the time is not known.
std::string pairAsText(const ShotPair& pair);

/// The numbers of a pair as members of an object, floats to nine significant digits.
Json pairAsJson(const ShotPair& pair);

}  // namespace pelorin::cli
