#include "cli/frame/filter_files.h"

#include <fmt/format.h>

#include <algorithm>
#include <memory>
#include <optional>

#include "cli/frame/each_photo.h"
#include "cli/frame/errors.h"
#include "cli/frame/file_bytes.h"
#include "cli/frame/interrupt.h"
#include "cli/frame/jobs_option.h"
#include "cli/frame/json_output.h"
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
  std::uint64_t pixels = 0;                            // bytes of them that a file may keep
  bool again = false;                                  // whatever marks a photo carries
  std::unique_ptr<photo::ThreadWorkers> workers = {};  // of all files at once; null for none
};

struct Done {
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

Done process(const Work& work, const PlannedFile& file, Talk& talk) {
  thread_local photo::SparePixels spare;  // each worker's own
  photo::OpenOptions open = work.photo;
  open.stop = interruptToken();
  const std::vector<std::uint8_t> bytes = readInput(file.input);
  if (!work.again && !open.raw) {
    const photo::PhotoFacts facts = photo::readFacts(bytes);
    if (const photo::EditMark* mark = photo::earlierEdit(facts, work.filter.filter))
      return {.earlier = textOf(*mark)};
  }
  const photo::FilteredPhoto filtered =
      photo::filterPhoto(bytes,
                         {.filter = work.filter.filter.name,
                          .params = work.filter.params,
                          .faces = work.faces.of(file.input),
                          .open = open,
                          .save = saveOptions(work.save),
                          .mark = false},  // but for the one that is to be saved
                         // A name may lie; what stands in place of a photo is of its kind.
                         work.inPlace ? nullptr : &outputFormat(file.output, work.save),
                         {.pixels = work.pixels, .spare = &spare, .workers = work.workers.get()});
  tellNotices(file.input, filtered.facts, talk);
  SaveChoice save = work.save;
  if (!work.inPlace && work.keepsTimes && !file.input.isStandardInput()) {
    save.replace.timesOf = file.input.path;
  }
  if (file.skipped) {  // done again: the backup has the first one, to which undo leads back
    refuseLosses(filtered.lost, save.strict);
    photo::recordResult(save.backup, file.output, filtered.file);
    save.backup.clear();
  }
  writePhoto(file.output, filtered.file, filtered.lost, save);
  return {.width = filtered.size.width,
          .height = filtered.size.height,
          .lost = filtered.lost,
          .notices = filtered.facts.notices};
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
  verb.option("--memory", options.memory,
              "MiB for decoded pixels, 128 unless given, shared by the files at once; photos that "
              "need more are decoded twice, or kept where that cannot be")
      .between(0, 1 << 20)
      .type("MIB")
      .group("Reporting");
}

void addFilterFilesOptions(Verb verb, FilterFilesOptions& options,
                           const std::string& placeholders) {
  addInputOptions(verb, options.inputs);
  addOutputOptions(verb, options.outputs, "{stem}_{filter}.{ext}", placeholders);
  addInPlaceOptions(verb, options.outputs);
  addFilteringOptions(verb, options);
  addRawOption(verb, options.raw);
  verb.named("--raw").help("Read and write packed RGBA bytes of this size instead of photos");
  addReportOptions(verb, options.report);
}

ExitCode filterFiles(const std::string& verb, FilterFilesOptions options,
                     const FilterToApply& filter, const ToldFile& told) {
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
  const std::vector<PlannedFile> plan = planOutputs(named, options.inputs, options.outputs, values);
  std::vector<Input> inputs;
  for (const PlannedFile& file : plan) {
    requireFormatOf(file.output, raw);
    inputs.push_back(file.input);
  }

  JsonOutput json(options.report, isSingleFile(options.inputs, named));
  Talk talk(verb, options.report, options.outputs.planOnly ? 0 : plan.size());
  const bool inPlace = options.outputs.inPlace;
  if (options.outputs.planOnly) {
    return printPlan(
        plan, inPlace ? " (replaced already: skipped)" : " (exists: skipped without --overwrite)",
        talk, json);
  }

  const std::size_t atOnce =
      std::clamp<std::size_t>(plan.size(), 1, static_cast<std::size_t>(jobsAtOnce(options.jobs)));
  work.pixels = (std::uint64_t{static_cast<unsigned>(options.memory)} << 20) / atOnce;
  if (atOnce == 1 && plan.size() > 1) recycleFreedMemory();
  const std::size_t threads = threadsForEach(options.threads, options.jobs, plan.size());
  if (threads > 1) {
    // One of the threads is the job's own.
    work.workers = std::make_unique<photo::ThreadWorkers>(atOnce * (threads - 1) + 1);
  }
  const OutputFolders folders(plan);
  std::size_t skipped = 0, marked = 0;
  const PhotoTally tally = eachPhoto<std::optional<Done>>(
      inputs, options.jobs, talk,
      {.work = [&](std::size_t index) -> std::optional<Done> {
         const bool again = inPlace && work.again;
         return plan[index].skipped && !again ? std::nullopt
                                              : std::optional(process(work, plan[index], talk));
       },
       .done =
           [&](std::size_t index, const std::optional<Done>& done) {
             if (!done) {
               ++skipped;
               json.add(planAsJson(plan[index], "exists"));
               if (told) told(plan[index], "exists");
               return;
             }
             if (!done->earlier.empty()) {
               ++marked;
               talk.noteOnce(
                   done->earlier,
                   fmt::format("{}: {} ({}); --again does it again{}",
                               plan[index].input.shownName(), filter.doneAlready, done->earlier,
                               plan.size() > 1 ? " (others like it are not named)" : ""));
               Json object = planAsJson(plan[index], "edited");
               object["earlier"] = done->earlier;
               json.add(object);
               if (told) told(plan[index], "edited");
               return;
             }
             Json object = planAsJson(plan[index], "done");
             object["width"] = done->width;
             object["height"] = done->height;
             object["filter"] = filter.filter.name;
             object["params"] = filter.params;
             object["lost"] = jsonOf(done->lost);
             object["notices"] = done->notices;
             json.add(object);
             for (const photo::Loss& loss : done->lost) {
               talk.note(plan[index].output + ": " + lossText(loss));
             }
             if (told) told(plan[index], "done");
           },
       .failed =
           [&](std::size_t index, const std::string& reason) {
             Json object = planAsJson(plan[index], "failed");
             object["error"] = reason;
             json.add(object);
             if (told) told(plan[index], "failed");
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
  if (tally.interrupted) talk.note("interrupted; finished files stand");
  const ExitCode code = tally.exitCode(talk);
  return code == ExitCode::allDone && done == 0 ? ExitCode::nothingToDo : code;
}

}  // namespace pelorin::cli
