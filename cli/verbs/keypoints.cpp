#include <fmt/format.h>

#include <algorithm>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

#include "cli/frame/each_photo.h"
#include "cli/frame/errors.h"
#include "cli/frame/file_bytes.h"
#include "cli/frame/lone_files.h"
#include "cli/frame/photo_files.h"
#include "cli/frame/raw_option.h"
#include "cli/pictures/corner_picture.h"
#include "cli/verbs/corners.h"
#include "cli/verbs/verbs.h"
#include "photo/photo_rows.h"

namespace pelorin::cli {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;

struct KeypointsOptions {
  std::string input, raw;
  CornerSearch search;
  bool unsuppressed = false;
  bool text = false;
  LoneOutputOptions drawing;
  ReportOptions report;
};

struct Keypoints {
  std::uint32_t width, height;
  std::vector<Corner> corners;
};

std::string countText(std::size_t count, const CornerSearch& search) {
  return fmt::format("{} {} (FAST-{}, threshold {}{})", count, count == 1 ? "corner" : "corners",
                     search.arc, search.threshold, search.suppressed ? "" : ", not suppressed");
}

Image<RGBA8Pixel> drawingOf(const ShownPhoto& photo, const Input& input,
                            const std::vector<Corner>& corners, const CornerSearch& search) {
  std::vector<MarkedPixel> marks;
  for (const Corner& corner : corners) {
    marks.push_back({corner.position.x, corner.position.y, static_cast<float>(corner.score)});
  }
  const std::string name = input.isStandardInput()
                               ? input.shownName()
                               : std::filesystem::path(input.path).filename().string();
  const std::string about = fmt::format("{} \xC3\x97 {} pixels, {}", photo.size.width,
                                        photo.size.height, countText(corners.size(), search));
  return drawCorners(photo, std::move(marks), "Corners of " + name, about,
                     "Score: the largest threshold at which it is still a corner");
}

Json jsonOf(const Input& input, const Keypoints& keypoints, const CornerSearch& search) {
  Json object = {{"file", input.path},
                 {"width", keypoints.width},
                 {"height", keypoints.height},
                 {"n", search.arc},
                 {"threshold", search.threshold},
                 {"suppressed", search.suppressed},
                 {"count", keypoints.corners.size()},
                 {"corners", Json::array()}};
  for (const Corner& corner : keypoints.corners) {
    Json entry = {{"x", corner.position.x}, {"y", corner.position.y}, {"score", corner.score}};
    if (corner.descriptor) entry["descriptor"] = hexOf(*corner.descriptor);
    object["corners"].push_back(std::move(entry));
  }
  return object;
}

void printText(const Keypoints& keypoints) {
  for (const Corner& corner : keypoints.corners) {
    fmt::print("{} {} {}", corner.position.x, corner.position.y, corner.score);
    if (corner.descriptor) fmt::print(" {}", hexOf(*corner.descriptor));
    fmt::print("\n");
  }
}

void printSummary(const Input& input, const Keypoints& keypoints, const CornerSearch& search) {
  fmt::print("{}\n", input.shownName());
  fmt::print("  size         {} x {} (upright)\n", keypoints.width, keypoints.height);
  fmt::print("  found        {}\n", countText(keypoints.corners.size(), search));
  if (keypoints.corners.empty()) return;
  std::vector<int> scores;
  for (const Corner& corner : keypoints.corners) scores.push_back(corner.score);
  std::ranges::sort(scores);
  fmt::print("  scores       {} to {}, median {}\n", scores.front(), scores.back(),
             scores[scores.size() / 2]);
  if (search.described) {
    const auto described = std::ranges::count_if(
        keypoints.corners, [](const Corner& corner) { return corner.descriptor.has_value(); });
    fmt::print("  descriptors  {}, the other corners are too close to a border\n", described);
  }
}

ExitCode runKeypoints(const KeypointsOptions& options) {
  photo::OpenOptions photoOptions = {.faces = false};
  photoOptions.raw = readRawSize(options.raw);
  CornerSearch search = options.search;
  search.suppressed = !options.unsuppressed;
  const Input input = loneInput(options.input);
  const std::string& path = options.drawing.output;
  if (path == "-") {
    throw UsageError("--draw: name a file; standard output has the corners");
  }
  requireFormatOf(path, /*raw=*/false);
  const std::vector<std::string> outputs(path.empty() ? 0 : 1, path);
  Talk talk("keypoints", options.report, 1);
  JsonOutput json(options.report, true);
  if (const auto code = stopBeforeWork({input}, outputs, options.drawing, talk, json)) return *code;

  const PhotoTally tally = eachPhoto<Keypoints>(
      {input}, /*jobs=*/1, talk,
      {.work =
           [&](std::size_t) {
             const photo::OpenedFile file = openInput(input, photoOptions);
             photo::PhotoRows photo(file.view(), limited(photoOptions));
             const auto [width, height] = photo.size();
             image_processing::RowSource& rows = photo.sweep(/*again=*/false);
             Keypoints keypoints = {width, height, {}};
             if (path.empty()) {
               keypoints.corners = findCorners(width, height, rows, search);
             } else {
               RowsToShow shown(rows, photo.size());
               keypoints.corners = findCorners(width, height, shown, search);
               const auto picture = drawingOf(shown.shown(), input, keypoints.corners, search);
               savePicture(path, picture, {}, drawing(options.drawing.overwrite));
             }
             tellNotices(input, photo.facts(), talk);
             return keypoints;
           },
       .done =
           [&](std::size_t, const Keypoints& keypoints) {
             if (json.wanted()) {
               json.add(jsonOf(input, keypoints, search));
             } else if (options.text) {
               printText(keypoints);
             } else {
               printSummary(input, keypoints, search);
             }
           }});
  return tally.exitCode(talk);
}

}  // namespace

void addKeypoints(CommandLine& commandLine) {
  const auto options = std::make_shared<KeypointsOptions>();
  Verb verb =
      commandLine.addVerb("keypoints", "Find a photo's corners (FAST) and describe them (BRIEF)",
                          "quenby keypoints photo.jpg\n"
                          "quenby keypoints photo.jpg --text > corners.txt\n"
                          "quenby keypoints photo.jpg --draw corners.png --threshold 40\n"
                          "quenby keypoints photo.jpg --json --brief\n"
                          "quenby keypoints --text --raw 640x480 - < in.rgba",
                          [options] { return runKeypoints(*options); });
  addLoneInput(verb, options->input);
  verb.option("--n", options->search.arc,
              "How many neighbouring pixels of the 16 on a circle of radius 3 must all be "
              "brighter or all darker than its centre; 9 unless given")
      .between(9, 12);
  verb.option("--threshold", options->search.threshold,
              "By more than how much, in green; 20 unless given")
      .between(0, 255);
  verb.flag("--no-suppression", options->unsuppressed,
            "Keep corners beside a corner with the same or a higher score");
  verb.flag("--brief", options->search.described,
            "Add descriptors, 64 hexadecimal digits, bit 255 first, to the corners that are "
            "more than 15 pixels from every border");
  verb.option("--draw", options->drawing.output,
              "Draw the corners over the photo; a " + photo::pictureExtensions() + " file")
      .type("FILE")
      .group("Output");
  verb.flag("--overwrite", options->drawing.overwrite, "Replace a drawing that is there")
      .needs(verb.named("--draw"))
      .group("Output");
  verb.flag("-n,--dry-run", options->drawing.planOnly,
            "Print what would become what, and do nothing")
      .needs(verb.named("--draw"))
      .group("Output");
  addRawOption(verb, options->raw);
  Option text =
      verb.flag("--text", options->text,
                "Print a line `x y score` for each corner, row by row, and its descriptor "
                "behind it")
          .group("Reporting");
  addReportOptions(verb, options->report);
  text.excludes(verb.named("--json")).excludes(verb.named("--jsonl"));
}

}  // namespace pelorin::cli
