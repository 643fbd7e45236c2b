#include <fmt/format.h>

#include <algorithm>
#include <filesystem>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "cli/frame/each_photo.h"
#include "cli/frame/errors.h"
#include "cli/frame/file_bytes.h"
#include "cli/frame/html_page.h"
#include "cli/frame/jobs.h"
#include "cli/frame/jobs_option.h"
#include "cli/frame/limits.h"
#include "cli/frame/memory_option.h"
#include "cli/frame/number_text.h"
#include "cli/frame/outputs.h"
#include "cli/frame/talk.h"
#include "cli/frame/used_files.h"
#include "cli/verbs/dupes/act_on_plan.h"
#include "cli/verbs/dupes/html_report.h"
#include "cli/verbs/dupes/plan_file.h"
#include "cli/verbs/dupes/report.h"
#include "cli/verbs/dupes/scan_photos.h"
#include "cli/verbs/dupes/thumbnail.h"
#include "cli/verbs/verbs.h"
#include "photo/collection/pair_search.h"
#include "photo/collection/photo_score.h"
#include "photo/format.h"

namespace fs = std::filesystem;

namespace pelorin::cli {
namespace {

struct DupesOptions {
  InputOptions inputs;
  ReportOptions report;
  std::string threshold = fmt::format("{}", photo::leastDupeScore);
  std::string scale = "auto";
  std::string cache;
  std::string keep;
  std::vector<std::string> keepUnder;
  std::string plan;
  ActionOptions actions;
  std::string html;
  bool assumeFileTime = false;
  bool unknownTimes = false;
  bool pairs = false;
  bool overwrite = false;
  bool planOnly = false;
  int jobs = 0;
  int memory = usualMemory;
};

constexpr const char* verbName = "dupes";

// At most a few hundred pieces, to share among cores and to show how far the search is.
bool searchPairs(const std::vector<photo::Shot>& shots, float threshold,
                 const DupesOptions& options, std::vector<photo::ShotPair>& pairs) {
  const photo::PairSearch search(shots, threshold, options.unknownTimes);
  constexpr std::size_t together = 64;  // steps: their shots are compared with each other
  const std::size_t steps = search.stepCount();
  const std::size_t pieces = std::min<std::size_t>((steps + together - 1) / together, 400);
  Talk talk(verbName, options.report, pieces);
  std::vector<std::vector<photo::ShotPair>> found(pieces);
  const bool finished = runJobs(
      pieces, options.jobs,
      [&](std::size_t piece) {
        photo::PreparedShots prepared(shots);
        // From everywhere: neighbours in time are equally dense, so pieces are equally long.
        for (std::size_t first = piece * together; first < steps; first += pieces * together) {
          for (std::size_t step = first; step < std::min(first + together, steps); ++step) {
            stopIfInterrupted();
            search.run(step, prepared, found[piece]);
          }
        }
      },
      [&](std::size_t piece) {
        pairs.insert(pairs.end(), found[piece].begin(), found[piece].end());
        found[piece] = {};
        talk.fileDone();
      });
  photo::sortPairs(pairs);
  return finished;
}

// Reads the photos whose score decides once more, unless the cache knows it.
bool scorePhotos(const DupesOptions& options, photo::PhotoCache* cache, std::string& cacheTrouble,
                 DupeReport& report) {
  struct Unscored {
    std::size_t photo;
    std::optional<photo::FileStamp> stamp;  // taken before the file is read
  };
  std::vector<Unscored> unscored;
  for (const std::size_t i : photo::photosToScore(report.groups, report.photos)) {
    photo::ScannedPhoto& photo = report.photos[i];
    if (photo.path == "-") continue;  // cannot be read twice
    const std::optional<photo::FileStamp> stamp = photo::stampOf(photo.path);
    if (cache != nullptr && stamp) photo.niqe = cache->findScore(photo.path, *stamp);
    if (!photo.niqe) unscored.push_back({i, stamp});
  }
  std::vector<Input> inputs;
  for (const Unscored& photo : unscored) inputs.push_back({report.photos[photo.photo].path, {}});
  Talk talk(verbName, options.report, inputs.size());
  KeptPixels pixels(options.memory, options.jobs, inputs.size());
  const PhotoTally tally =
      eachPhoto<float>(inputs, options.jobs, talk,
                       {.work =
                            [&](std::size_t job) {
                              const KeptPixels::Lent lent(pixels);
                              return photo::scoreOf(readInput(inputs[job]), interruptToken(),
                                                    lent.resources(), limits().decode);
                            },
                        .done =
                            [&](std::size_t job, float score) {
                              const auto& [i, stamp] = unscored[job];
                              report.photos[i].niqe = score;
                              if (cache == nullptr || !stamp || !cacheTrouble.empty()) return;
                              try {
                                cache->storeScore(inputs[job].path, *stamp, score);
                              } catch (const photo::CacheError& error) {
                                cacheTrouble = error.what();
                              }
                            },
                        .failed =
                            [&](std::size_t job, const std::string& reason) {
                              report.failed.push_back({inputs[job].path, reason});
                            },
                        .failure = "no score of it: "});
  return !tally.interrupted;
}

// Reads the photos of all groups once more, for their pictures.
bool writeHtml(const DupesOptions& options, DupeReport& report) {
  std::vector<std::size_t> shown;
  std::vector<Input> inputs;
  for (const auto* groups : {&report.groups, &report.lookAlikes}) {
    for (const photo::DupeGroup& group : *groups) {
      for (const std::size_t photo : group.photos) {
        if (report.photos[photo].path == "-") continue;  // cannot be read twice
        shown.push_back(photo);
        inputs.push_back({report.photos[photo].path, {}});
      }
    }
  }
  using Thumbnail = std::vector<std::uint8_t>;
  std::vector<Thumbnail> thumbnails(report.photos.size());
  {
    Talk talk(verbName, options.report, inputs.size());
    const PhotoTally tally = eachPhoto<Thumbnail>(
        inputs, options.jobs, talk,
        {.work = [&](std::size_t job) { return thumbnailOf(report.photos[shown[job]], talk); },
         .done = [&](std::size_t job,
                     const Thumbnail& thumbnail) { thumbnails[shown[job]] = thumbnail; },
         .failed =
             [&](std::size_t job, const std::string& reason) {
               report.failed.push_back({inputs[job].path, reason});
             },
         .failure = "no picture of it: "});
    if (tally.interrupted) return false;
  }
  writePage(options.html, htmlReport(report, thumbnails), options.overwrite);
  return true;
}

void printReport(const DupesOptions& options, const DupeReport& report) {
  if (options.report.json) {
    Json document = {{"threshold", nineDigits(report.threshold)},
                     {"photos", report.photos.size()},
                     {"groups", Json::array()},
                     {"lookAlikes", Json::array()},
                     {"failed", Json::array()}};
    for (const photo::DupeGroup& group : report.groups) {
      document["groups"].push_back(groupAsJson(report, group));
    }
    for (const photo::DupeGroup& group : report.lookAlikes) {
      document["lookAlikes"].push_back(groupAsJson(report, group));
    }
    for (const photo::FailedPhoto& failed : report.failed) {
      document["failed"].push_back(failureAsJson(failed));
    }
    JsonOutput(options.report, /*singleFile=*/true).add(document);
  } else if (options.report.jsonLines) {
    JsonOutput json(options.report, /*singleFile=*/false);
    for (const photo::DupeGroup& group : report.groups) json.add(groupAsJson(report, group));
    for (const photo::DupeGroup& group : report.lookAlikes) json.add(groupAsJson(report, group));
    for (const photo::FailedPhoto& failed : report.failed) json.add(failureAsJson(failed));
  } else if (options.html != "-") {
    std::size_t number = 0;
    for (const photo::DupeGroup& group : report.groups) {
      fmt::print("{}", groupAsText(report, group, ++number));
    }
    for (const photo::DupeGroup& group : report.lookAlikes) {
      fmt::print("{}", groupAsText(report, group, ++number));
    }
  }
}

void checkOutputs(const DupesOptions& options, const std::vector<Input>& inputs) {
  const std::string& html = options.html;
  const std::string& cache = options.cache;
  if (html == "-" && (options.report.json || options.report.jsonLines)) {
    throw UsageError("--html -: standard output takes the page or --json, not both");
  }
  if (photo::isPictureExtension(fs::path(cache).extension().string())) {
    throw UsageError("--cache: " + cache + " is called like a photo; choose another name");
  }
  UsedFiles used = usedFiles(inputs);
  if (!cache.empty()) {
    refuseSharedFiles({cache}, used);
    // SQLite keeps its journals beside the file.
    for (const char* end : {"", "-journal", "-wal", "-shm"}) used.add(cache + end, "the cache");
  }
  if (!html.empty()) checkPage("--html", html, options.overwrite, std::move(used));
}

void noteUntimed(const DupesOptions& options, const DupeReport& report, Talk& talk) {
  if (options.unknownTimes) return;
  const auto untimed = std::count_if(
      report.photos.begin(), report.photos.end(),
      [](const photo::ScannedPhoto& photo) { return photo.timeSource == photo::TimeSource::none; });
  if (untimed == 0) return;
  talk.note(
      fmt::format("{} of {} photos tell no time and were left out; --assume-mtime takes that of "
                  "their files, --unknown-times looks for those that look alike",
                  untimed, report.photos.size()));
}

// Where a time is not known, looks are all there is: a class of its own, never ranked.
void groupAlike(const std::vector<photo::ShotPair>& pairs, DupeReport& report) {
  std::vector<photo::ShotPair> timed, untimed;
  for (const photo::ShotPair& pair : pairs) {
    if (pair.timesKnown) {
      timed.push_back(pair);
    } else if (pair.score >= photo::leastLookAlikeScore) {
      untimed.push_back(pair);
    }
  }
  report.groups = photo::groupWholly(report.photos.size(), timed);
  report.lookAlikes = photo::groupWholly(report.photos.size(), untimed);
}

bool ranks(const DupesOptions& options) {
  return !options.keep.empty() || !options.keepUnder.empty() || options.actions.wanted();
}

bool isBelow(const fs::path& path, const fs::path& folder) {
  const fs::path below = path.lexically_relative(folder);
  return !below.empty() && *below.begin() != "..";
}

std::vector<fs::path> referenceFolders(const DupesOptions& options) {
  std::vector<fs::path> folders;
  for (const std::string& folder : options.keepUnder) {
    std::error_code failed;
    folders.push_back(fs::canonical(folder, failed));
    // A misspelt folder would leave its photos unprotected.
    if (failed || !fs::is_directory(folders.back())) {
      throw UsageError("--keep-under: " + folder + ": is no folder");
    }
  }
  return folders;
}

void markReferences(const std::vector<fs::path>& folders,
                    std::vector<photo::ScannedPhoto>& photos) {
  for (photo::ScannedPhoto& photo : photos) {
    std::error_code failed;
    const fs::path path = fs::canonical(photo.path, failed);
    photo.isReference = std::any_of(folders.begin(), folders.end(),
                                    [&](const fs::path& folder) { return isBelow(path, folder); });
  }
}

ExitCode runPlan(const DupesOptions& options) {
  if (!options.inputs.names.empty() || !options.inputs.lists.empty()) {
    throw UsageError("--plan: the photos are those of the plan; leave out the others");
  }
  if (!options.actions.wanted()) {
    throw UsageError("--plan: say what to do, with --move-to DIR or --link");
  }
  const std::vector<photo::Removal> plan = readPlan(options.plan);
  std::vector<Input> files;
  for (const photo::Removal& removal : plan) {
    for (const photo::KnownFile& file : removal.removed) files.push_back({file.path, {}});
    for (const photo::KnownFile& file : removal.kept) files.push_back({file.path, {}});
  }
  checkActions(options.actions, files);
  return actOnPlan(plan, options.actions, options.report);
}

ExitCode runDupes(const DupesOptions& options) {
  if (options.planOnly && options.actions.apply) {
    throw UsageError("-n does nothing and --apply does it: leave out one of them");
  }
  if (!options.plan.empty()) return runPlan(options);
  const float threshold = readFiniteNumber("--threshold", options.threshold);
  const std::vector<Input> inputs = withoutRepetitions(expandInputs(options.inputs));
  const std::vector<fs::path> references = referenceFolders(options);
  checkActions(options.actions, inputs);
  if (inputs.empty()) {
    Talk(verbName, options.report.quiet, 0).note("no photos found");
    DupeReport nothing = {};
    nothing.threshold = threshold;
    printReport(options, nothing);
    return ExitCode::nothingToDo;
  }
  checkOutputs(options, inputs);
  std::vector<std::string> pages;
  if (!options.html.empty() && !options.planOnly) pages.push_back(options.html);
  const OutputFolders folders(pages);
  std::unique_ptr<photo::PhotoCache> cache;
  if (!options.cache.empty() && !options.planOnly)
    cache = std::make_unique<photo::PhotoCache>(options.cache);

  ScanResult scan;
  {
    Talk talk(verbName, options.report, inputs.size());
    scan = scanPhotos(inputs,
                      {options.scale == "auto" ? photo::automaticScale : std::stoi(options.scale),
                       options.jobs, options.assumeFileTime, cache.get()},
                      talk);
  }
  if (scan.interrupted) return ExitCode::interrupted;
  std::vector<photo::ShotPair> pairs;
  if (!searchPairs(scan.library.shots, threshold, options, pairs)) return ExitCode::interrupted;

  DupeReport report = {threshold,    std::move(scan.library.photos), {},
                       {},           std::move(scan.failed),         ranks(options),
                       options.pairs};
  markReferences(references, report.photos);
  groupAlike(pairs, report);
  if (report.rank && !scorePhotos(options, cache.get(), scan.cacheTrouble, report)) {
    return ExitCode::interrupted;
  }
  if (!options.html.empty() && !options.planOnly && !writeHtml(options, report))
    return ExitCode::interrupted;
  ExitCode acted = ExitCode::allDone;
  if (options.actions.wanted()) {
    acted = actOnPlan(photo::planRemovals(report.groups, report.photos), options.actions,
                      options.report);
  } else {
    printReport(options, report);
  }

  Talk talk(verbName, options.report.quiet, 0);
  noteUntimed(options, report, talk);
  talk.note(summaryOf(report));
  if (options.planOnly && !options.html.empty()) {
    talk.note(shownText(options.html) + ": would be written without -n");
  }
  if (!scan.cacheTrouble.empty()) {
    fmt::print(stderr, "quenby {}: {}\n", verbName, shownText(scan.cacheTrouble));
  }
  const bool trouble = !report.failed.empty() || !scan.cacheTrouble.empty();
  return trouble && acted != ExitCode::interrupted ? ExitCode::someFailed : acted;
}

}  // namespace

void addDupes(CommandLine& commandLine) {
  const auto options = std::make_shared<DupesOptions>();
  Verb verb = commandLine.addVerb(
      verbName, "Find near-duplicates among photos: the same scene, a moment apart",
      "quenby dupes -r holiday\n"
      "quenby dupes -r photos -j 0 --cache photos.cache --html report.html\n"
      "quenby dupes *.jpg --threshold 2.5 --keep best\n"
      "quenby dupes -r import library --keep-under library --move-to doubles --apply\n"
      "quenby dupes --plan duplicates.json --move-to doubles --apply\n"
      "quenby dupes -r photos --keep best --jsonl | jq -r '.ranking[]? | select(.keep | not).file'",
      [options] { return runDupes(*options); });
  addInputOptions(verb, options->inputs);
  verb.option("--threshold", options->threshold,
              fmt::format("Smallest score of a pair; {} unless given, larger is stricter, the same "
                          "photo twice scores about 3.65",
                          photo::leastDupeScore))
      .type("SCORE");
  verb.option("--scale", options->scale,
              "Decode photos at 1/1, 1/2, 1/4 or 1/8 of their size; auto, unless given, is "
              "1/8 from 4 megapixels on and less for smaller photos")
      .oneOf({"auto", "1", "2", "4", "8"});
  verb.flag("--assume-mtime", options->assumeFileTime,
            "Photos without a capture time take that of their file; otherwise they are left out");
  verb.flag("--unknown-times", options->unknownTimes,
            fmt::format("Also tell which photos look alike where a time is not known: apart from "
                        "the groups, with scores from {} on, and never ranked by --keep",
                        photo::leastLookAlikeScore));
  verb.flag("--pairs", options->pairs,
            "Tell every pair of a group with its score, time and distance; a group of n photos has "
            "n (n - 1) / 2");
  verb.option("--cache", options->cache,
              "Keep what was read in this file, so that the next run reads only new and "
              "changed photos")
      .type("FILE");
  verb.option("--keep", options->keep,
              "best: say in each group which photo to keep, by resolution, then by how "
              "natural it looks (NIQE), then by the size of the file; photos of equal "
              "resolution are read again for that; nothing is ever deleted")
      .oneOf({"best"});
  verb.option("--keep-under", options->keepUnder,
              "Never suggest photos below this folder for removal: of others like them only one "
              "with more pixels stays")
      .type("DIR")
      .oneValueEach();
  addActionOptions(verb, options->actions);
  verb.option("--plan", options->plan,
              "Act on what was chosen in the page of --html and saved there, instead of searching")
      .type("FILE")
      .group("Acting");
  verb.option("--html", options->html,
              "Write a page with the groups' pictures side by side; reads those photos again")
      .type("FILE")
      .group("Output");
  verb.flag("--overwrite", options->overwrite, "Replace an --html file that exists")
      .group("Output");
  verb.flag("-n,--dry-run", options->planOnly,
            "Say what is found and write nothing, neither the page nor the cache")
      .group("Output");
  addJobsOption(verb, options->jobs);
  addMemoryOption(verb, options->memory);
  addReportOptions(verb, options->report);
}

}  // namespace pelorin::cli
