#include "cli/verbs/dupes/report.h"

#include <fmt/format.h>

#include <algorithm>

#include "cli/frame/number_text.h"

namespace pelorin::cli {
namespace {

const char* nameOf(TimeSource source) {
  switch (source) {
    case TimeSource::camera:
      return "camera";
    case TimeSource::file:
      return "file";
    case TimeSource::none:
      break;
  }
  return "none";
}

Json photoAsJson(const ScannedPhoto& photo) {
  return {{"file", photo.input.path},
          {"width", photo.width},
          {"height", photo.height},
          {"bytes", photo.bytes ? Json(*photo.bytes) : Json()},
          {"orientation", photo.orientation},
          {"time", photo.time.empty() ? Json() : Json(photo.time)},
          {"timeSource", nameOf(photo.timeSource)}};
}

}  // namespace

std::string timeText(const ScannedPhoto& photo) {
  if (photo.timeSource == TimeSource::none) return "time not known";
  return photo.time + (photo.timeSource == TimeSource::file ? " (file)" : "");
}

std::string pairAsText(const ShotPair& pair) {
  return fmt::format("score {:.2f}, {}, distance {:.4f}, {} orientation", pair.score,
                     pair.timesKnown ? fmt::format("{:.2f} s apart", pair.seconds)
                                     : std::string("time apart not known, taken as 0"),
                     pair.distance, pair.sameOrientation ? "same" : "different");
}

Json pairAsJson(const ShotPair& pair) {
  return {{"score", nineDigits(pair.score)},
          {"timeDifference", pair.seconds},
          {"timesKnown", pair.timesKnown},
          {"distance", nineDigits(pair.distance)},
          {"sameOrientation", pair.sameOrientation}};
}

std::string groupAsText(const DupeReport& report, const DupeGroup& group, std::size_t number) {
  std::string text = fmt::format("Group {}\n", number);
  for (const std::size_t i : group.photos) {
    const ScannedPhoto& photo = report.photos[i];
    text += fmt::format("  {}  {} x {}, {}\n", photo.input.shownName(), photo.width, photo.height,
                        timeText(photo));
  }
  for (const ShotPair& pair : group.pairs) {
    text += fmt::format("  {} + {}: {}\n", report.photos[pair.first].input.shownName(),
                        report.photos[pair.second].input.shownName(), pairAsText(pair));
  }
  if (!report.rank) return text;
  const char* verdict = "keep";
  for (const Ranked& ranked : rankGroup(group, report.photos)) {
    text += fmt::format("  {} {}: {}\n", verdict, report.photos[ranked.photo].input.shownName(),
                        ranked.reason);
    verdict = "rather not";
  }
  return text;
}

Json groupAsJson(const DupeReport& report, const DupeGroup& group) {
  Json object = {{"photos", Json::array()}, {"pairs", Json::array()}};
  for (const std::size_t i : group.photos)
    object["photos"].push_back(photoAsJson(report.photos[i]));
  for (const ShotPair& pair : group.pairs) {
    Json entry = {{"a", report.photos[pair.first].input.path},
                  {"b", report.photos[pair.second].input.path}};
    entry.update(pairAsJson(pair));
    object["pairs"].push_back(std::move(entry));
  }
  if (report.rank) {
    Json& ranking = object["ranking"] = Json::array();
    for (const Ranked& ranked : rankGroup(group, report.photos)) {
      const ScannedPhoto& photo = report.photos[ranked.photo];
      ranking.push_back({{"file", photo.input.path},
                         {"keep", ranking.empty()},
                         {"niqe", photo.isScored() ? Json(nineDigits(*photo.niqe)) : Json()},
                         {"reason", ranked.reason}});
    }
  }
  return object;
}

Json failureAsJson(const FailedPhoto& failed) {
  return {{"file", failed.input.path}, {"error", failed.reason}};
}

std::string summaryOf(const DupeReport& report) {
  std::size_t grouped = 0;
  for (const DupeGroup& group : report.groups) grouped += group.photos.size();
  if (grouped == 0) {
    return fmt::format("no near-duplicates among {} photos", report.photos.size());
  }
  return fmt::format("{} {} with {} of {} photos", report.groups.size(),
                     report.groups.size() == 1 ? "group" : "groups", grouped, report.photos.size());
}

}  // namespace pelorin::cli
