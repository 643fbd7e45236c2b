#include <fmt/format.h>

#include <filesystem>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "cli/frame/each_photo.h"
#include "cli/frame/errors.h"
#include "cli/frame/file_bytes.h"
#include "cli/frame/interrupt.h"
#include "cli/frame/jobs_option.h"
#include "cli/frame/memory_option.h"
#include "cli/frame/number_text.h"
#include "cli/frame/outputs.h"
#include "cli/frame/photo_files.h"
#include "cli/frame/print_plan.h"
#include "cli/frame/raw_option.h"
#include "cli/pictures/heat_map.h"
#include "cli/verbs/score_output.h"
#include "cli/verbs/verbs.h"
#include "image_processing/quality/block_features.h"

namespace pelorin::cli {
namespace {

using image_processing::Image;
using image_processing::niqeBlockSize;
using image_processing::RGBA8Pixel;

struct ScoreOptions {
  InputOptions inputs;
  ScoreFormat format;
  OutputOptions maps;
  Option mapGiven;
  std::optional<std::string> failAbove;
  std::string raw;
  int jobs = 0;
  int memory = usualMemory;
};

Image<RGBA8Pixel> heatMapOf(const ShownPhoto& photo, const Input& input,
                            const ScoredPhoto& scored) {
  const std::string name = input.isStandardInput()
                               ? input.shownName()
                               : std::filesystem::path(input.path).filename().string();
  const auto& niqe = scored.niqe;
  const std::string about =
      fmt::format("NIQE {:.2f}, {} \xC3\x97 {} pixels, {} \xC3\x97 {} blocks", niqe.score,
                  scored.width, scored.height, niqe.blockColumns, niqe.blockRows);
  return drawHeatMap(photo, {niqeBlockSize, niqe.blockColumns, niqe.blockRows, niqe.blockDistances},
                     "Quality of " + name, about,
                     "Distance of each block from natural photos; lower is better");
}

/// @param map        where the heat map goes; null for none.
/// @param overwrite  whether it may replace a file.
ScoredPhoto score(const Input& input, const photo::OpenOptions& options,
                  const photo::RowResources& resources, const PlannedFile* map, bool overwrite,
                  Talk& talk) {
  const photo::OpenedFile file = openInput(input, options);
  photo::PhotoRows photo(file.view(), limited(options), resources);
  const auto [width, height] = photo.size();
  image_processing::RowSource& rows = photo.sweep(/*again=*/false);
  const bool mapped = map != nullptr && !map->skipped;
  std::optional<RowsToShow> shown;
  if (mapped) shown.emplace(rows, photo.size());
  ScoredPhoto scored = {width, height,
                        image_processing::analyzeNiqe(width, height, mapped ? *shown : rows)};
  stopIfInterrupted();
  if (mapped && !scored.isTooSmall())
    savePicture(map->output, heatMapOf(shown->shown(), input, scored), {}, drawing(overwrite));
  tellNotices(input, photo.facts(), talk);
  return scored;
}

std::vector<PlannedFile> planMaps(const ScoreOptions& options, const std::vector<Input>& inputs) {
  if (!options.mapGiven.given()) return {};
  const std::string& output = options.maps.output;
  if (output.empty() || output == "-") {
    throw UsageError("--map: name a file or an existing folder; standard output has the scores");
  }
  std::vector<PlannedFile> plan = planOutputs(inputs, options.inputs, options.maps, {});
  for (const PlannedFile& file : plan) requireFormatOf(file.output, /*raw=*/false);
  return plan;
}

ExitCode runScore(const ScoreOptions& options) {
  std::optional<float> limit;
  if (options.failAbove) limit = readFiniteNumber("--fail-above", *options.failAbove);
  photo::OpenOptions photoOptions = {.faces = false};
  photoOptions.raw = readRawSize(options.raw, options.inputs);
  const std::vector<Input> inputs = expandInputs(options.inputs);
  const std::vector<PlannedFile> maps = planMaps(options, inputs);
  const bool singleFile = isSingleFile(options.inputs, inputs);
  Talk talk("score", options.format.report, options.maps.planOnly ? 0 : inputs.size());
  if (options.maps.planOnly) {
    JsonOutput json(options.format.report, singleFile);
    return printPlan(maps, " (exists: skipped without --overwrite)", "", talk, json);
  }
  const OutputFolders folders(maps);
  ScoreOutput output(options.format, singleFile);
  KeptPixels pixels(options.memory, options.jobs, inputs.size());
  std::size_t scored = 0, above = 0, mapsKept = 0;
  const auto report = [&](std::size_t index, const ScoredPhoto& photo) {
    const Input& input = inputs[index];
    output.add(input, photo);
    if (photo.isTooSmall()) {
      talk.error(input.shownName(),
                 fmt::format("is {} x {} pixels, too small: a score needs {} x {} or more",
                             photo.width, photo.height, niqeBlockSize, niqeBlockSize));
      return;
    }
    ++scored;
    if (limit && !(photo.niqe.score <= *limit)) {
      ++above;
      talk.error(input.shownName(),
                 fmt::format("scores {:.9g}, above {}", photo.niqe.score, *options.failAbove));
    }
    if (!maps.empty() && maps[index].skipped) {
      ++mapsKept;
    }
  };
  const PhotoTally tally = eachPhoto<ScoredPhoto>(
      inputs, options.jobs, talk,
      {.work =
           [&](std::size_t index) {
             const KeptPixels::Lent lent(pixels);
             return score(inputs[index], photoOptions, lent.resources(),
                          maps.empty() ? nullptr : &maps[index], options.maps.overwrite, talk);
           },
       .done = report,
       .failed = [&](std::size_t index,
                     const std::string& reason) { output.addFailed(inputs[index], reason); }});
  if (mapsKept > 0) {
    talk.note(fmt::format("{} of {} maps there already; --overwrite replaces them", mapsKept,
                          maps.size()));
  }
  const ExitCode code = tally.exitCode(talk);
  if (code != ExitCode::allDone) return code;
  if (above > 0) return ExitCode::aboveLimit;
  return scored == 0 ? ExitCode::nothingToDo : ExitCode::allDone;
}

}  // namespace

void addScore(CommandLine& commandLine) {
  const auto options = std::make_shared<ScoreOptions>();
  Verb verb = commandLine.addVerb("score", "Say how natural photos look (NIQE; lower is better)",
                                  "quenby score photo.jpg\n"
                                  "quenby score --csv -r holiday -j 0 > scores.csv\n"
                                  "quenby score --fail-above 6 *.jpg\n"
                                  "quenby score photo.jpg --map heat.png\n"
                                  "quenby score -r holiday --map heat/ --name '{stem}_heat.png'\n"
                                  "quenby score --features --raw 640x480 - < in.rgba",
                                  [options] { return runScore(*options); });
  verb.addToFooter(
      "\n4: every file was scored or too small, and a score is above --fail-above."
      "\n1 comes before 4; 3 also says that every photo was too small.\n"
      "\nScores are of the full-size upright picture and compare only under one model."
      "\nThey change when a picture is scaled, so score pictures at one size."
      "\nSides below 96 pixels are too small: a line on stderr, null in JSON, an empty"
      "\nfield in CSV.");
  addInputOptions(verb, options->inputs);
  Option csv = verb.flag("--csv", options->format.csv,
                         "Print comma-separated values, with a line of names first")
                   .group("Reporting");
  verb.flag("--features", options->format.features,
            "Print the 36 mean features, one a line (after a # line with the file's name "
            "when there are several); with --csv or --json beside the score")
      .group("Reporting");
  verb.option("--fail-above", options->failAbove, "Exit with 4 when a score is above this")
      .type("X");
  options->mapGiven =
      verb.option("--map", options->maps.output,
                  "Write each photo's heat map, the distances of its blocks over the photo, "
                  "to this " +
                      photo::pictureExtensions() + " file or into this folder")
          .type("FILE|DIR")
          .group("Output");
  options->maps.name = "{stem}_niqe.png";
  verb.option("--name", options->maps.name,
              "How maps are called in a folder; {stem}_niqe.png unless given")
      .type("PATTERN")
      .needs(options->mapGiven)
      .group("Output");
  verb.flag("--overwrite", options->maps.overwrite, "Replace maps that are there already")
      .needs(options->mapGiven)
      .group("Output");
  verb.flag("-n,--dry-run", options->maps.planOnly,
            "Print which maps would be made, and do nothing")
      .needs(options->mapGiven)
      .group("Output");
  addRawOption(verb, options->raw);
  addJobsOption(verb, options->jobs);
  addMemoryOption(verb, options->memory);
  addReportOptions(verb, options->format.report);
  csv.excludes(verb.named("--json")).excludes(verb.named("--jsonl"));
}

}  // namespace pelorin::cli
