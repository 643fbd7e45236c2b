#include <fmt/format.h>

#include <array>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "cli/frame/each_photo.h"
#include "cli/frame/errors.h"
#include "cli/frame/json_output.h"
#include "cli/frame/limits.h"
#include "cli/frame/number_text.h"
#include "cli/frame/photo_files.h"
#include "cli/frame/raw_option.h"
#include "cli/frame/talk.h"
#include "cli/verbs/dupes/report.h"
#include "cli/verbs/verbs.h"
#include "image_processing/dupe/cdf_distance.h"
#include "photo/collection/pair_search.h"
#include "photo/collection/photo_record.h"

namespace pelorin::cli {
namespace {

struct CompareOptions {
  std::string a, b;
  std::string dt, sameOrientation;
  std::string raw, raw2;
  int scale = 1;
  ReportOptions report;
};

photo::Shot readShot(const Input& input, const photo::OpenOptions& options, Talk& talk) {
  const photo::Photo photo = loadPhoto(input, options, talk);
  photo::Shot shot;
  image_processing::GreenCDF cdf;
  image_processing::computeGreenCDF(*photo.image, cdf);
  shot.cdf = {cdf, photo.image->pixelCount()};
  shot.orientation = photo.facts.orientation;
  if (photo.facts.captureTime) shot.time = photo::shotTime(*photo.facts.captureTime);
  return shot;
}

photo::OpenOptions openOptions(int scale, const std::string& raw) {
  photo::OpenOptions options;
  options.scale = scale;
  options.raw = readRawSize(raw);
  return options;
}

ExitCode runCompare(const CompareOptions& options) {
  if (options.a == "-" && options.b == "-") {
    throw UsageError("standard input can be named only once");
  }
  const bool anyRaw = !options.raw.empty() || !options.raw2.empty();
  if (anyRaw && options.scale != 1) {
    throw UsageError("--scale: raw pixels are read at their full size");
  }
  std::optional<float> givenSeconds;
  if (!options.dt.empty()) givenSeconds = readFiniteNumber("--dt", options.dt);

  const std::vector<Input> inputs = {{options.a, {}}, {options.b, {}}};
  const std::array open = {
      openOptions(options.scale, options.raw),
      openOptions(options.scale, options.raw2.empty() ? options.raw : options.raw2)};
  std::array<photo::Shot, 2> shots;
  auto& [a, b] = shots;
  Talk talk("compare", options.report.quiet, 0);
  const PhotoTally tally = eachPhoto<photo::Shot>(
      inputs, /*jobs=*/1, talk,
      {.work = [&](std::size_t index) { return readShot(inputs[index], open[index], talk); },
       .done = [&](std::size_t index, const photo::Shot& shot) { shots[index] = shot; }});
  if (tally.done < shots.size()) return tally.exitCode(talk);
  const char* timeSource = a.time && b.time ? "camera" : "unknown";
  if (givenSeconds) {
    timeSource = "given";
    a.time = photo::ShotTime{0.0, std::nullopt};
    b.time = photo::ShotTime{*givenSeconds, std::nullopt};
  }
  if (!options.sameOrientation.empty()) {
    a.orientation = 1;
    b.orientation = options.sameOrientation == "yes" ? 1 : 2;
  }

  const photo::ShotPair pair = photo::compareShots(a, b);
  const float gainAB = image_processing::matchCDFDomain(a.cdf.unpacked(), b.cdf.unpacked());
  const float gainBA = image_processing::matchCDFDomain(b.cdf.unpacked(), a.cdf.unpacked());
  JsonOutput json(options.report, /*singleFile=*/true);
  if (json.wanted()) {
    Json object = {{"a", options.a}, {"b", options.b}};
    object.update(pairAsJson(pair));
    object["timeSource"] = timeSource;
    object["gainAB"] = nineDigits(gainAB);
    object["gainBA"] = nineDigits(gainBA);
    json.add(object);
    return ExitCode::allDone;
  }
  fmt::print("score        {:.9g}\n", pair.score);
  fmt::print("distance     {:.9g}\n", pair.distance);
  fmt::print("gain A to B  {:.9g}\n", gainAB);
  fmt::print("gain B to A  {:.9g}\n", gainBA);
  fmt::print("time apart   {}\n", pair.timesKnown
                                      ? fmt::format("{:.9g} s ({})", pair.seconds, timeSource)
                                      : std::string("not known, taken as 0"));
  fmt::print("orientation  {}\n", pair.sameOrientation ? "same" : "different");
  return ExitCode::allDone;
}

}  // namespace

void addCompare(CommandLine& commandLine) {
  const auto options = std::make_shared<CompareOptions>();
  Verb verb =
      commandLine.addVerb("compare", "Tell how likely two photos are near-duplicates, and why",
                          "quenby compare a.jpg b.jpg\n"
                          "quenby compare a.jpg b.jpg --dt 2.5 --same-orientation yes --json\n"
                          "quenby compare a.rgba b.rgba --raw 640x480 --raw2 480x640",
                          [options] { return runCompare(*options); });
  verb.option("A", options->a, "One photo: " + aPhotoFile()).type("FILE").required().group("Input");
  verb.option("B", options->b, "Another").type("FILE").required().group("Input");
  verb.option("--dt", options->dt,
              "Seconds between the two; from the cameras' times unless given, 0 where those "
              "are not known")
      .type("SECONDS");
  verb.option("--same-orientation", options->sameOrientation,
              "Whether the camera was held alike; from the photos unless given")
      .oneOf({"yes", "no"});
  verb.option("--scale", options->scale, "Decode at 1/1, 1/2, 1/4 or 1/8 of the size")
      .oneOf({"1", "2", "4", "8"});
  addRawOption(verb, options->raw);
  verb.option("--raw2", options->raw2,
              "Size of B's raw pixels where it is another than A's; alone, only B is raw")
      .type("WxH")
      .group("Raw pixels");
  addReportOptions(verb, options->report);
  addLimitOptions(verb);
}

}  // namespace pelorin::cli
