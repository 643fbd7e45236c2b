#include "cli/verbs/dupes/report.h"

#include <fmt/format.h>

#include <algorithm>

#include "cli/frame/number_text.h"

namespace pelorin::cli {
namespace {

const char* nameOf(photo::TimeSource source) {
  switch (source) {
    case photo::TimeSource::camera:
      return "camera";
    case photo::TimeSource::file:
      return "file";
    case photo::TimeSource::none:
      break;
  }
  return "none";
}

bool isLarge(const photo::DupeGroup& group) {
  return group.photos.size() > largestPlainGroup;
}

// What a group's pairs have in common.
struct GroupSpan {
  float lowest, highest;  // of the scores
  double seconds;         // the longest time between two photos
};

GroupSpan spanOf(const photo::DupeGroup& group) {
  GroupSpan span = {group.pairs.front().score, group.pairs.front().score, 0.0};
  for (const photo::ShotPair& pair : group.pairs) {
    span.lowest = std::min(span.lowest, pair.score);
    span.highest = std::max(span.highest, pair.score);
    span.seconds = std::max(span.seconds, pair.seconds);
  }
  return span;
}

Json photoAsJson(const photo::ScannedPhoto& photo) {
  return {{"file", photo.path},
          {"width", photo.width},
          {"height", photo.height},
          {"bytes", photo.bytes ? Json(*photo.bytes) : Json()},
          {"orientation", photo.orientation},
          {"time", photo.time.empty() ? Json() : Json(photo.time)},
          {"timeSource", nameOf(photo.timeSource)}};
}

}  // namespace

std::string timeText(const photo::ScannedPhoto& photo) {
  if (photo.timeSource == photo::TimeSource::none) return "time not known";
  return photo.time + (photo.timeSource == photo::TimeSource::file ? " (file)" : "");
}

std::string pairAsText(const photo::ShotPair& pair) {
  return fmt::format("score {:.2f}, {}, distance {:.4f}, {} orientation", pair.score,
                     pair.timesKnown ? fmt::format("{:.2f} s apart", pair.seconds)
                                     : std::string("time apart not known, taken as 0"),
                     pair.distance, pair.sameOrientation ? "same" : "different");
}

Json pairAsJson(const photo::ShotPair& pair) {
  return {{"score", nineDigits(pair.score)},
          {"timeDifference", pair.seconds},
          {"timesKnown", pair.timesKnown},
          {"distance", nineDigits(pair.distance)},
          {"sameOrientation", pair.sameOrientation}};
}

bool isOfLooksAlone(const photo::DupeGroup& group) {
  return !group.pairs.empty() && !group.pairs.front().timesKnown;
}

std::string groupSummary(const photo::DupeGroup& group) {
  const GroupSpan span = spanOf(group);
  std::string text = fmt::format("{} photos, ", group.photos.size());
  text += span.lowest == span.highest
              ? fmt::format("score {:.2f}", span.lowest)
              : fmt::format("scores {:.2f} to {:.2f}", span.lowest, span.highest);
  text += isOfLooksAlone(group) ? std::string(", time apart not known, taken as 0")
                                : fmt::format(", within {:.2f} s", span.seconds);
  if (isLarge(group)) {
    text += fmt::format(
        "; more than {}: a series rather than doubles, which a higher --threshold "
        "parts",
        largestPlainGroup);
  }
  return text;
}

std::string groupAsText(const DupeReport& report, const photo::DupeGroup& group,
                        std::size_t number) {
  const bool looksAlone = isOfLooksAlone(group);
  std::string text =
      fmt::format("Group {}: {}{}\n", number, looksAlone ? "look alike, time unknown: " : "",
                  groupSummary(group));
  for (const std::size_t i : group.photos) {
    const photo::ScannedPhoto& photo = report.photos[i];
    text += fmt::format("  {}  {} x {}, {}\n", shownName(photo.path), photo.width, photo.height,
                        timeText(photo));
  }
  for (const photo::ShotPair& pair : toldPairs(report, group)) {
    text += fmt::format("  {} + {}: {}\n", shownName(report.photos[pair.first].path),
                        shownName(report.photos[pair.second].path), pairAsText(pair));
  }
  if (!report.rank || looksAlone) return text;
  for (const photo::Ranked& ranked : photo::rankGroup(group, report.photos)) {
    text += fmt::format("  {} {}: {}\n", ranked.keep ? "keep" : "rather not",
                        shownName(report.photos[ranked.photo].path), ranked.reason);
  }
  return text;
}

Json groupAsJson(const DupeReport& report, const photo::DupeGroup& group) {
  const GroupSpan span = spanOf(group);
  Json object = {{"photos", Json::array()},
                 {"lowestScore", nineDigits(span.lowest)},
                 {"highestScore", nineDigits(span.highest)},
                 {"seconds", span.seconds},
                 {"large", isLarge(group)}};
  for (const std::size_t i : group.photos)
    object["photos"].push_back(photoAsJson(report.photos[i]));
  for (const photo::ShotPair& pair : toldPairs(report, group)) {
    Json entry = {{"a", report.photos[pair.first].path}, {"b", report.photos[pair.second].path}};
    entry.update(pairAsJson(pair));
    object["pairs"].push_back(std::move(entry));
  }
  const bool looksAlone = isOfLooksAlone(group);
  if (looksAlone) object["timeUnknown"] = true;
  if (report.rank && !looksAlone) {
    Json& ranking = object["ranking"] = Json::array();
    for (const photo::Ranked& ranked : photo::rankGroup(group, report.photos)) {
      const photo::ScannedPhoto& photo = report.photos[ranked.photo];
      ranking.push_back({{"file", photo.path},
                         {"keep", ranked.keep},
                         {"niqe", photo.isScored() ? Json(nineDigits(*photo.niqe)) : Json()},
                         {"reason", ranked.reason}});
    }
  }
  return object;
}

Json failureAsJson(const photo::FailedPhoto& failed) {
  return {{"file", failed.path}, {"error", failed.reason}};
}

std::span<const photo::ShotPair> toldPairs(const DupeReport& report,
                                           const photo::DupeGroup& group) {
  if (!report.pairs) return {};
  return group.pairs;
}

std::string summaryOf(const DupeReport& report) {
  std::size_t grouped = 0;
  for (const photo::DupeGroup& group : report.groups) grouped += group.photos.size();
  const std::size_t alike = report.lookAlikes.size();
  const std::string besides = alike == 0 ? ""
                                         : fmt::format("; {} {} alike, times unknown", alike,
                                                       alike == 1 ? "group looks" : "groups look");
  if (grouped == 0) {
    return fmt::format("no near-duplicates among {} photos{}", report.photos.size(), besides);
  }
  const auto large = std::count_if(report.groups.begin(), report.groups.end(), isLarge);
  return fmt::format("{} {} with {} of {} photos{}{}", report.groups.size(),
                     report.groups.size() == 1 ? "group" : "groups", grouped, report.photos.size(),
                     large == 0
                         ? std::string()
                         : fmt::format(", {} of them of more than {}", large, largestPlainGroup),
                     besides);
}

}  // namespace pelorin::cli
