#pragma once

#include <span>
#include <string>
#include <vector>

#include "cli/frame/inputs.h"
#include "cli/frame/json_output.h"
#include "photo/collection/best_photo.h"
#include "photo/collection/grouping.h"
#include "photo/collection/scanned_photo.h"

namespace pelorin::cli {

/// What a search for duplicates has found.
struct DupeReport {
  float threshold;
  std::vector<photo::ScannedPhoto> photos;
  std::vector<photo::DupeGroup> groups;
  std::vector<photo::DupeGroup> lookAlikes;  ///< Those with a time that is not known; never ranked.
  std::vector<photo::FailedPhoto> failed;
  bool rank;           ///< Whether each group is ranked by what to keep.
  bool pairs = false;  ///< Whether every pair is told; they grow with the square of a group.
};

/// More photos than that in a group are rather a series than doubles of one.
constexpr std::size_t largestPlainGroup = 20;

/// "2024-05-01T12:30:45+02:00", followed by " (file)" where it is only the time of the file, or
/// "time not known".
std::string timeText(const photo::ScannedPhoto& photo);

/// Whether a time is not known between photos of the group, so that only their looks speak for it.
bool isOfLooksAlone(const photo::DupeGroup& group);

/// One group in a few lines, for a terminal; `number` counts from 1.
std::string groupAsText(const DupeReport& report, const photo::DupeGroup& group,
                        std::size_t number);

/// One group as an object.
Json groupAsJson(const DupeReport& report, const photo::DupeGroup& group);

/// A file that could not be read as an object.
Json failureAsJson(const photo::FailedPhoto& failed);

/// "3 photos, scores 1.62 to 3.65, within 2.5 s", and more where the group is large.
std::string groupSummary(const photo::DupeGroup& group);

/// "2 groups with 5 of 120 photos".
std::string summaryOf(const DupeReport& report);

/// The pairs of a group that the report tells: all or none.
std::span<const photo::ShotPair> toldPairs(const DupeReport& report, const photo::DupeGroup& group);

/// "score 2.41, 0.8 s apart, distance 0.0123, same orientation"; says where the time is not known.
std::string pairAsText(const photo::ShotPair& pair);

/// The numbers of a pair as members of an object, floats to nine significant digits.
Json pairAsJson(const photo::ShotPair& pair);

}  // namespace pelorin::cli
