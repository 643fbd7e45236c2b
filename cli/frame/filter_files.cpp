#include "cli/frame/filter_files.h"

#include <fmt/format.h>

#include <algorithm>
#include <filesystem>
#include <memory>
#include <optional>

#include "cli/frame/comparison_page.h"
#include "cli/frame/each_photo.h"
#include "cli/frame/errors.h"
#include "cli/frame/file_bytes.h"
#include "cli/frame/html_page.h"
#include "cli/frame/interrupt.h"
#include "cli/frame/jobs_option.h"
#include "cli/frame/json_output.h"
#include "cli/frame/limits.h"
#include "cli/frame/photo_files.h"
#include "cli/frame/print_plan.h"
#include "cli/frame/raw_option.h"
#include "cli/frame/recycled_memory.h"
#include "photo/backup.h"
#include "photo/filter_photo.h"
#include "photo/thread_workers.h"

namespace pelorin::cli {
namespace {

struct Work {
  FilterToApply filter;
  FaceChoice faces;
  photo::OpenOptions photo;
  SaveChoice save;
  bool inPlace = false, keepsTimes = false;
  bool again = false;                                  // whatever marks a photo carries
  std::optional<ComparisonSize> shown = {};            // on a page, where there is to be one
  std::unique_ptr<KeptPixels> pixels = {};             // of all files at once, as the workers
  std::unique_ptr<photo::ThreadWorkers> workers = {};  // null for none
};

struct Done {
  std::string section = {};  // of the page
  bool existed = false;      // nothing else is there then
  std::string earlier = {};  // the same edit, which stays the only one; nothing else is there then
  std::uint32_t width = 0, height = 0;
  std::vector<photo::Loss> lost = {};
  std::vector<std::string> notices = {};
};

Work readOptions(const FilterFilesOptions& options, const FilterToApply& filter) {
  Work work = {filter, FaceChoice(options.faces), {}, {}};
  work.inPlace = options.outputs.inPlace;
  work.keepsTimes = options.outputs.keepsTimes();
  work.save = {.raw = !options.raw.empty(),
               .quality = qualityOf(options.coding, work.inPlace ? photo::sourceQuality : 90),
               .sampling = samplingOf(options.coding),
               .keep = keepOptions(options.keep),
               .strict = options.keep.strict,
               .replace = {.mayReplace = options.outputs.overwrite || work.inPlace,
                           .keepTimes = work.inPlace && work.keepsTimes},
               .backup = options.outputs.backup};
  work.again = options.mark.again;
  if (!options.mark.without && !work.save.raw)
    work.save.mark = commandMark(filter.filter.name, filter.params);
  if (work.faces.areNamed() && !filter.filter.parameters().readsFaces) {
    throw UsageError("--face: has no effect on " + filter.filter.name);
  }
  if (options.rotate % 90 != 0) throw UsageError("--rotate: must be a multiple of 90");
  work.photo = {.scale = options.scale, .rotate = options.rotate, .faces = work.faces.asksPhoto()};
  work.photo.raw = readRawSize(options.raw, options.inputs);
  if (work.photo.raw && options.scale != 1) {
    throw UsageError("--scale: raw pixels are read at their full size");
  }
  return work;
}

// What is shown of a photo; what goes wrong there is said in its place, for the result stands.
std::string sectionOf(const Work& work, const PlannedFile& file, const Done& done,
                      const photo::FileView& before, const photo::FileView& after) {
  if (!work.shown) return "";
  ComparedPhoto photo = {.input = file.input.path, .lost = done.lost};
  if (after.size() > 0 && !work.inPlace) photo.output = file.output;
  if (done.existed) photo.remark = "was there already";
  if (!done.earlier.empty()) photo.remark = work.filter.doneAlready + " (" + done.earlier + ")";
  try {
    std::vector<std::uint8_t> whole;  // of a result of several scans, which is not read in parts
    if (after.rest != nullptr && !photo::formatOf(after.bytes).mayBePart(after.bytes))
      whole = photo::wholeOf(after);
    const Comparison pictures = compareFiles({.before = before,
                                              .after = whole.empty() ? after : whole,
                                              .open = work.photo,
                                              .faces = work.faces.of(file.input),
                                              .filter = work.filter.filter.name,
                                              .params = work.filter.params},
                                             *work.shown);
    photo.pictures = &pictures;
    return comparisonSection(photo);
  } catch (const Interrupted&) {
    return "";  // the photo is done, and no page is made
  } catch (const std::exception& error) {
    photo.remark += (photo.remark.empty() ? "" : "; ") + ("no picture: " + explain(error));
    return comparisonSection(photo);
  }
}

// A result that an earlier run left beside its photo, or in its place.
Done existing(const Work& work, const PlannedFile& file) {
  Done done = {.existed = true};
  if (!work.shown) return done;
  try {
    Input before = file.input;
    if (work.inPlace) before.path = photo::backupPath(work.save.backup, before.path);
    done.section = sectionOf(work, file, done, openInput(before, work.photo).view(),
                             openInput({file.output, {}}, work.photo).view());
  } catch (const Interrupted&) {
    throw;
  } catch (const std::exception& error) {
    done.section = comparisonSection(
        {.input = file.input.path, .remark = "was there already; no picture: " + explain(error)});
  }
  return done;
}

// The mark of the same edit, as text; empty without one, and where edits are done again.
std::string earlierEdit(const Work& work, const photo::FileView& file) {
  if (work.again || work.photo.raw) return "";
  const photo::PhotoFacts facts = photo::openRows(file, {.limits = limits().decode})->facts();
  const photo::EditMark* const mark = photo::earlierEdit(facts, work.filter.filter);
  return mark == nullptr ? "" : textOf(*mark);
}

// Reads only files, which are the same afterwards. What is wrong with one is said when it is worked on.
void findMarks(const Work& work, int jobs, std::vector<PlannedFile>& plan) {
  const auto find = [&](std::size_t index) {
    PlannedFile& file = plan[index];
    std::error_code ignored;
    if (file.skipped || !std::filesystem::is_regular_file(file.input.path, ignored)) return;
    try {
      file.earlier = earlierEdit(work, openInput(file.input, work.photo).view());
    } catch (const Interrupted&) {
      throw;
    } catch (const std::exception&) {
    }
  };
  if (!runJobs(plan.size(), jobs, find, [](std::size_t) {})) throw Interrupted();
}

Done process(const Work& work, const PlannedFile& file, Talk& talk) {
  const photo::OpenOptions open = limited(work.photo);
  const KeptPixels::Lent lent(*work.pixels);
  photo::RowResources resources = lent.resources();
  resources.workers = work.workers.get();
  const photo::OpenedFile input = openInput(file.input, work.photo);
  if (std::string earlier = earlierEdit(work, input.view()); !earlier.empty()) {
    Done done = {.earlier = std::move(earlier)};
    done.section = sectionOf(work, file, done, input.view(), {});
    return done;
  }
  photo::TemporaryStore overflow(std::filesystem::path(file.output).parent_path());
  photo::SaveOptions coding = saveOptions(work.save);
  std::error_code ignored;
  // The folder of a device or a pipe is no place for temporaries.
  if (file.output != "-" && !std::filesystem::is_other(file.output, ignored))
    coding.overflow = &overflow;
  const photo::FilteredPhoto filtered =
      photo::filterPhoto(input.view(),
                         {.filter = work.filter.filter.name,
                          .params = work.filter.params,
                          .faces = work.faces.of(file.input),
                          .open = open,
                          .save = coding,
                          .mark = false},  // but for the one that is to be saved
                         // A name may lie; what stands in place of a photo is of its kind.
                         work.inPlace ? nullptr : &outputFormat(file.output, work.save), resources);
  tellNotices(file.input, filtered.facts, talk);
  const photo::FileView result = {filtered.file, overflow.size() > 0 ? &overflow : nullptr};
  SaveChoice save = work.save;
  if (!work.inPlace && work.keepsTimes && !file.input.isStandardInput()) {
    save.replace.timesOf = file.input.path;
  }
  if (file.skipped) {  // done again: the backup has the first one, to which undo leads back
    refuseLosses(filtered.lost, save.strict);
    photo::recordResult(save.backup, file.output, result);
    save.backup.clear();
  }
  writePhoto(file.output, result, filtered.lost, save);
  Done done = {.width = filtered.size.width,
               .height = filtered.size.height,
               .lost = filtered.lost,
               .notices = filtered.facts.notices};
  done.section = sectionOf(work, file, done, input.view(), result);
  return done;
}

// Before any work. The page must be none of the files that a run reads or writes.
void checkPageOf(const FilterFilesOptions& options, const std::vector<PlannedFile>& plan) {
  const bool takesOutput = options.outputs.output == "-" || options.report.json ||
                           options.report.jsonLines || options.outputs.planOnly;
  if (options.page == "-" && takesOutput) {
    throw UsageError("--report -: standard output takes the page and nothing else");
  }
  if (plan.size() > mostCompared) {
    throw UsageError(fmt::format("--report: {} photos are too many for one page, which takes {}",
                                 plan.size(), mostCompared));
  }
  UsedFiles used;
  for (const PlannedFile& file : plan) {
    used.add(file.input.path, "an input");
    used.add(file.output, "a result");
  }
  for (const std::string& list : listsOf(options.inputs)) used.add(list, "the list of inputs");
  used.add(options.faces.source, "the file of faces");
  checkPage("--report", options.page, options.outputs.overwrite, std::move(used));
}

std::string photosText(std::size_t photos) {
  return fmt::format("{} {}", photos, photos == 1 ? "photo" : "photos");
}

Json jsonOf(const std::vector<photo::Loss>& lost) {
  Json list = Json::array();
  for (const photo::Loss& loss : lost) list.push_back({{"what", loss.what}, {"why", loss.why}});
  return list;
}

}  // namespace

void addFilteringOptions(Verb verb, FilterFilesOptions& options) {
  addFaceOptions(verb, options.faces);
  verb.option("--rotate", options.rotate,
              "Turn further by so many degrees clockwise, a multiple of 90")
      .type("DEGREES");
  verb.option("--scale", options.scale, "Decode at 1/1, 1/2, 1/4 or 1/8 of the size")
      .oneOf({"1", "2", "4", "8"});
  addCodingOptions(verb, options.coding);
  addKeepOptions(verb, options.keep);
  addMarkOptions(verb, options.mark);
  addJobsOption(verb, options.jobs);
  addThreadsOption(verb, options.threads);
  addMemoryOption(verb, options.memory);
}

void addFilterFilesOptions(Verb verb, FilterFilesOptions& options,
                           const std::string& placeholders) {
  addInputOptions(verb, options.inputs);
  addOutputOptions(verb, options.outputs, "{stem}_{filter}.{ext}", placeholders);
  addInPlaceOptions(verb, options.outputs);
  addFilteringOptions(verb, options);
  verb.option("--report", options.page,
              "Also make a page of all photos that shows each before and after, with a divider, "
              "its faces, histograms and steps of the slider; one file, for any browser")
      .type("FILE")
      .group("Output");
  addRawOption(verb, options.raw);
  verb.named("--raw").help("Read and write packed RGBA bytes of this size instead of photos");
  addReportOptions(verb, options.report);
}

ExitCode filterFiles(const std::string& verb, FilterFilesOptions options,
                     const FilterToApply& filter, const FileListener& listener) {
  Work work = readOptions(options, filter);
  const bool raw = work.photo.raw.has_value();
  if (options.outputs.inPlace && (raw || work.photo.scale != 1)) {
    throw UsageError("--in-place: photos are replaced at their full size (no --scale, no --raw)");
  }
  if (options.outputs.output == "-" && (options.report.json || options.report.jsonLines)) {
    throw UsageError("-o -: standard output takes the picture or --json, not both");
  }
  const std::vector<Input> named = expandInputs(options.inputs);
  checkInPlace(options.outputs, named);
  if (options.outputs.name.empty()) {
    options.outputs.name = raw ? "{stem}_{filter}.rgba" : "{stem}_{filter}.{ext}";
  }
  std::map<std::string, std::string> values = filter.values;
  values["filter"] = filter.filter.name;
  std::vector<PlannedFile> plan = planOutputs(named, options.inputs, options.outputs, values);
  std::vector<Input> inputs;
  for (const PlannedFile& file : plan) {
    requireFormatOf(file.output, raw);
    inputs.push_back(file.input);
  }

  if (!options.page.empty()) {
    checkPageOf(options, plan);
    work.shown = comparisonSize(plan.size());
  }

  JsonOutput json(options.report, isSingleFile(options.inputs, named));
  Talk talk(verb, options.report, options.outputs.planOnly ? 0 : plan.size());
  const bool inPlace = options.outputs.inPlace;
  if (options.outputs.planOnly) {
    findMarks(work, options.jobs, plan);
    const ExitCode code = printPlan(
        plan, inPlace ? " (replaced already: skipped)" : " (exists: skipped without --overwrite)",
        filter.doneAlready, talk, json);
    if (!options.page.empty() && !json.wanted())
      fmt::print("before and after of {} -> {}\n", photosText(plan.size()),
                 shownText(options.page));
    return code;
  }

  const std::size_t atOnce =
      std::clamp<std::size_t>(plan.size(), 1, static_cast<std::size_t>(jobsAtOnce(options.jobs)));
  work.pixels = std::make_unique<KeptPixels>(options.memory, options.jobs, plan.size());
  if (atOnce == 1 && plan.size() > 1) recycleFreedMemory();
  const std::size_t threads = threadsForEach(options.threads, options.jobs, plan.size());
  if (threads > 1) {
    // One of the threads is the job's own.
    work.workers = std::make_unique<photo::ThreadWorkers>(atOnce * (threads - 1) + 1);
  }
  const OutputFolders folders(plan, options.page);
  if (listener.planned) listener.planned(plan);
  std::size_t skipped = 0, marked = 0;
  std::vector<std::string> sections;
  const PhotoTally tally = eachPhoto<Done>(
      inputs, options.jobs, talk,
      {.work =
           [&](std::size_t index) {
             const bool again = inPlace && work.again;
             return plan[index].skipped && !again ? existing(work, plan[index])
                                                  : process(work, plan[index], talk);
           },
       .done =
           [&](std::size_t index, const Done& done) {
             sections.push_back(done.section);
             if (done.existed) {
               ++skipped;
               json.add(planAsJson(plan[index], "exists"));
               if (listener.told) listener.told(plan[index], "exists", done.lost);
               return;
             }
             if (!done.earlier.empty()) {
               ++marked;
               talk.noteOnce(
                   done.earlier,
                   fmt::format("{}: {} ({}); --again does it again{}",
                               plan[index].input.shownName(), filter.doneAlready, done.earlier,
                               plan.size() > 1 ? " (others like it are not named)" : ""));
               Json object = planAsJson(plan[index], "edited");
               object["earlier"] = done.earlier;
               json.add(object);
               if (listener.told) listener.told(plan[index], "edited", done.lost);
               return;
             }
             Json object = planAsJson(plan[index], "done");
             object["width"] = done.width;
             object["height"] = done.height;
             object["filter"] = filter.filter.name;
             object["params"] = filter.params;
             object["lost"] = jsonOf(done.lost);
             object["notices"] = done.notices;
             json.add(object);
             for (const photo::Loss& loss : done.lost) {
               talk.note(plan[index].output + ": " + lossText(loss));
             }
             if (listener.told) listener.told(plan[index], "done", done.lost);
           },
       .failed =
           [&](std::size_t index, const std::string& reason) {
             Json object = planAsJson(plan[index], "failed");
             object["error"] = reason;
             json.add(object);
             if (work.shown) {
               sections.push_back(
                   comparisonSection({.input = plan[index].input.path, .remark = reason}));
             }
             if (listener.told) listener.told(plan[index], "failed", {});
           }});
  const std::size_t done = tally.done - skipped - marked;
  const char* const whatToDo =
      inPlace ? "replaced already, as the backups tell; quenby undo puts them back"
              : "there already; --overwrite replaces them";
  if (plan.size() > 1) {
    talk.note(fmt::format("{} of {} photos done, {} failed{}{}", done, plan.size(), tally.failed,
                          skipped == 0 ? "" : fmt::format(", {} {}", skipped, whatToDo),
                          marked == 0 ? "" : fmt::format(", {} {}", marked, filter.doneAlready)));
  } else if (skipped > 0) {
    talk.note(plan[0].output +
              (inPlace ? ": was replaced already, as its backup tells; quenby undo puts it back"
                       : ": exists already; add --overwrite to replace it"));
  }
  const bool interrupted = tally.interrupted || (work.shown && interruptRequested());
  if (interrupted) {
    talk.note(work.shown ? "interrupted; finished files stand, no page was made"
                         : "interrupted; finished files stand");
  }
  const bool showing = work.shown && !interrupted && !sections.empty();
  if (showing) {
    writePage(options.page,
              comparisonPage(photosText(plan.size()) + ": " +
                                 textOf(photo::markOf(filter.filter.name, filter.params)),
                             sections),
              options.outputs.overwrite);
  }
  const ExitCode code = interrupted ? ExitCode::interrupted : tally.exitCode(talk);
  return code == ExitCode::allDone && done == 0 && !showing ? ExitCode::nothingToDo : code;
}

}  // namespace pelorin::cli
