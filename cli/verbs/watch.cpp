#include <fmt/format.h>

#include <algorithm>
#include <chrono>
#include <filesystem>
#include <map>
#include <memory>
#include <set>
#include <system_error>
#include <utility>

#include "cli/frame/errors.h"
#include "cli/frame/filter_files.h"
#include "cli/frame/filter_options.h"
#include "cli/frame/interrupt.h"
#include "cli/frame/limits.h"
#include "cli/frame/look_name.h"
#include "cli/verbs/verbs.h"
#include "cli/verbs/watch/folder_events.h"
#include "cli/verbs/watch/settling.h"
#include "photo/collection/ledger.h"
#include "photo/file_io.h"
#include "photo/photo.h"

namespace fs = std::filesystem;

namespace pelorin::cli {
namespace {

constexpr const char* verbName = "watch";
constexpr const char* ledgerName = ".quenby-ledger";

struct WatchOptions {
  std::string folder;
  FilterFilesOptions files;
  std::string filter = "AE0";
  FilterOptions parameters;
  int settle = 2000;
  int every = 60;
  bool once = false;
};

std::int64_t milliseconds() {
  const auto now = std::chrono::steady_clock::now().time_since_epoch();
  return std::chrono::duration_cast<std::chrono::milliseconds>(now).count();
}

// Returns early when the command is to stop.
bool waitFor(FolderEvents& events, std::int64_t time) {
  constexpr std::int64_t longestDeaf = 200;  // so that Ctrl-C is heard
  for (std::int64_t left = time; left > 0 && !interruptRequested(); left -= longestDeaf) {
    if (events.wait(static_cast<int>(std::min(left, longestDeaf)))) return true;
  }
  return false;
}

class Watch {
 public:
  Watch(const WatchOptions& options, const FilterToApply& filter, const fs::path& folder,
        const fs::path& results)
      : options_(options),
        filter_(filter),
        folder_(folder),
        results_(results),
        settling_(isPlan() ? 0 : options.settle),
        ledger_((results / ledgerName).string(),
                isPlan() ? photo::LedgerUse::look : photo::LedgerUse::keep),
        talk_(verbName, options.files.report.quiet, 0) {}

  ExitCode run() {
    tellTrouble();
    if (isPlan()) {
      work(completePhotos());
      return planned_ ? ExitCode::allDone : ExitCode::nothingToDo;
    }
    try {
      goOn();
    } catch (const Interrupted&) {
      // How it is meant to end; finished files stand.
    }
    const std::size_t failed = failed_ + troubled_;
    talk_.note(fmt::format("{} photos done, {} failed", done_, failed));
    return failed > 0 ? ExitCode::someFailed : ExitCode::allDone;
  }

 private:
  using Photos = std::vector<std::pair<Input, photo::FileStamp>>;

  bool isPlan() const { return options_.files.outputs.planOnly; }

  void goOn() {
    while (!interruptRequested()) {
      listen();  // before looking, so that nothing comes unseen
      work(completePhotos());
      if (options_.once && !settling_.isWaiting()) break;
      if (settling_.isWaiting()) {
        // What changes meanwhile is seen then; a moment more, so that the time is over.
        pause(options_.settle + 1);
      } else {
        waitFor(events_, std::int64_t{options_.every} * 1000);
      }
    }
  }

  void pause(std::int64_t time) {
    const std::int64_t end = milliseconds() + time;
    while (!interruptRequested() && milliseconds() < end) {
      waitFor(events_, end - milliseconds());
    }
  }

  void listen() {
    bool heard = events_.listenTo(folder_.string());
    std::error_code failed;
    fs::recursive_directory_iterator entry(folder_, fs::directory_options::skip_permission_denied,
                                           failed);
    for (; !failed && entry != fs::recursive_directory_iterator(); entry.increment(failed)) {
      std::error_code ignored;
      if (entry->is_directory(ignored) && !entry->is_symlink(ignored)) {
        heard = events_.listenTo(entry->path().string()) && heard;
      }
    }
    if (heard) return;
    talk_.noteOnce("deaf", fmt::format("not every folder can be listened to; changes there are "
                                       "found every {} seconds",
                                       options_.every));
  }

  Photos completePhotos() {
    InputOptions below = options_.files.inputs;
    below.names = {folder_.string()};
    below.recursive = true;
    const std::int64_t now = milliseconds();
    Photos complete;
    troubled_ = 0;
    for (Input& input : expandInputs(below)) {
      if (isResult(input.path)) continue;
      const auto stamp = photo::stampOf(input.path);
      if (input.trouble.empty() && !stamp && !isGone(input.path)) {
        input.trouble = "its size and time cannot be read";
      }
      if (!input.trouble.empty()) {
        if (told_.insert(input.path).second) talk_.error(input.shownName(), input.trouble);
        ++troubled_;
        continue;
      }
      if (!stamp || isDone(input.path, *stamp)) continue;
      if (settling_.isComplete(input.path, *stamp, now)) complete.emplace_back(input, *stamp);
    }
    settling_.forgetAllBut(now);
    return complete;
  }

  static bool isGone(const std::string& path) {
    std::error_code failed;
    return !fs::exists(path, failed) && !failed;
  }

  bool isResult(const fs::path& path) const {
    const fs::path below = path.lexically_relative(results_);
    return !below.empty() && *below.begin() != "..";
  }

  bool isDone(const std::string& path, const photo::FileStamp& stamp) const {
    const auto failed = failures_.find(path);
    if (failed != failures_.end() && failed->second == stamp) return true;
    const photo::LedgerEntry* const entry = ledger_.find(path);
    return entry != nullptr && !entry->begun && entry->photo == stamp;
  }

  // A result that is as this left it, or that it was killed over, may be replaced by a newer one.
  bool isOurs(const photo::LedgerEntry* entry) const {
    if (options_.files.outputs.overwrite) return true;
    if (entry == nullptr) return false;
    if (entry->begun)
      return !fs::exists(entry->result) || options_.files.mark.without || isMarked(entry->result);
    return entry->stamp && entry->stamp == photo::stampOf(entry->result);
  }

  // Whoever put another file there since has not had it made by Quenby, as far as one can see.
  static bool isMarked(const std::string& result) {
    try {
      const photo::DecodeLimits most = limits().decode;
      const auto file = photo::readFile(result, {.largest = most.bytes});
      return !photo::readFacts(file, most).edits.empty();
    } catch (const std::exception&) {
      return false;
    }
  }

  void work(const Photos& photos) {
    // Photos of one folder, and of those the new ones and the changed ones, can be done at once.
    std::map<std::pair<fs::path, bool>, Photos> batches;
    for (const auto& photo : photos) {
      const bool ours = isOurs(ledger_.find(photo.first.path));
      batches[{photo.first.subfolder, ours}].push_back(photo);
    }
    for (const auto& [kind, batch] : batches) {
      try {
        filterBatch(batch, kind.first, kind.second);
      } catch (const UsageError&) {
        // Two of them would become one file: the first to come has it.
        for (const auto& photo : batch) filterAlone(photo, kind.first, kind.second);
      }
    }
    tellTrouble();
  }

  void filterAlone(const std::pair<Input, photo::FileStamp>& photo, const fs::path& subfolder,
                   bool mayReplace) {
    try {
      filterBatch({photo}, subfolder, mayReplace);
    } catch (const UsageError& error) {
      talk_.error(photo.first.shownName(), error.what());
      noteFailure(photo.first.path, photo.second);
    }
  }

  void filterBatch(const Photos& photos, const fs::path& subfolder, bool mayReplace) {
    if (interruptRequested()) return;
    FilterFilesOptions options = options_.files;
    options.inputs = {};
    std::map<std::string, photo::FileStamp> stamps;
    for (const auto& [input, stamp] : photos) {
      options.inputs.names.push_back(input.path);
      stamps[input.path] = stamp;
    }
    options.outputs.output = (results_ / subfolder / "").string();
    options.outputs.overwrite = mayReplace;
    options.report.quiet = true;  // this says of each photo what became of it
    const ExitCode code =
        filterFiles(verbName, options, filter_,
                    {.planned = [&](const std::vector<PlannedFile>& plan) { begin(plan, stamps); },
                     .told =
                         [&](const PlannedFile& file, const std::string& status,
                             const std::vector<photo::Loss>& lost) {
                           tell(file, status, stamps.at(file.input.path));
                           for (const photo::Loss& loss : lost)
                             talk_.note(file.output + ": " + lossText(loss));
                         }});
    if (isPlan() && code == ExitCode::allDone) planned_ = true;
  }

  // From here on results are ours, even where this is killed before it can say so.
  void begin(const std::vector<PlannedFile>& plan,
             const std::map<std::string, photo::FileStamp>& stamps) {
    std::map<std::string, photo::LedgerEntry> begun;
    for (const PlannedFile& file : plan) {
      if (file.skipped) continue;
      begun[file.input.path] = {stamps.at(file.input.path), file.output, {}, /*begun=*/true};
    }
    ledger_.put(begun);
  }

  void tell(const PlannedFile& file, const std::string& status, const photo::FileStamp& stamp) {
    if (status == "failed") {
      noteFailure(file.input.path, stamp);
      return;
    }
    const bool isDone = status == "done";
    const auto result = isDone ? photo::stampOf(file.output) : std::nullopt;
    ledger_.put(file.input.path, {stamp, file.output, result, /*begun=*/false});
    if (isDone) ++done_;
    if (options_.files.report.jsonLines || options_.files.report.quiet) return;
    fmt::print("{} -> {}{}\n", file.input.shownName(), shownText(file.output),
               isDone               ? ""
               : status == "edited" ? " (enhanced already: not again)"
                                    : " (exists: left without --overwrite)");
    std::fflush(stdout);
  }

  void noteFailure(const std::string& path, const photo::FileStamp& stamp) {
    failures_[path] = stamp;
    ++failed_;
  }

  void tellTrouble() {
    const std::string trouble = ledger_.takeTrouble();
    if (!trouble.empty()) talk_.note(trouble);
  }

  const WatchOptions& options_;
  const FilterToApply& filter_;
  const fs::path folder_, results_;
  FolderEvents events_;
  Settling settling_;
  photo::Ledger ledger_;
  Talk talk_;
  std::map<std::string, photo::FileStamp> failures_;  // tried again when they change, or next time
  std::size_t done_ = 0, failed_ = 0;
  std::set<std::string> told_;  // what cannot be looked at,
  std::size_t troubled_ = 0;    // and how much of that there was at the last look
  bool planned_ = false;
};

ExitCode runWatch(const WatchOptions& options) {
  const auto& filter = filterNamed(options.filter);
  Talk talk(verbName, options.files.report.quiet, 0);
  const std::string params = options.parameters.read(filter, talk);
  std::error_code failed;
  const fs::path folder = fs::canonical(options.folder, failed);
  const bool isMissing =
      failed == std::errc::no_such_file_or_directory || failed == std::errc::not_a_directory;
  if (failed && !isMissing) throw std::system_error(failed, options.folder);
  if (failed || !fs::is_directory(folder)) {
    throw UsageError(options.folder + ": is no folder that can be watched");
  }
  const bool isPlan = options.files.outputs.planOnly;
  if (!isPlan) fs::create_directories(options.files.outputs.output);
  const fs::path results = fs::weakly_canonical(options.files.outputs.output);
  if (results == folder) {
    throw UsageError(
        "-o: results among the photos would be watched themselves; name another "
        "folder");
  }
  if (!isPlan) photo::sweepLeftovers(results.string());
  try {
    return Watch(options, {filter, params, {}, "enhanced already"}, folder, results).run();
  } catch (const photo::LedgerInUse& error) {
    throw UsageError(error.what());
  }
}

}  // namespace

void addWatch(CommandLine& commandLine) {
  const auto options = std::make_shared<WatchOptions>();
  Verb verb =
      commandLine.addVerb(verbName, "Enhance photos as they come into a folder, each one once",
                          "quenby watch incoming -o enhanced\n"
                          "quenby watch incoming -o enhanced --slider 0.3 --once",
                          [options] { return runWatch(*options); });
  verb.option("DIR", options->folder,
              "The folder, with those below it; photos that are there already come first")
      .required()
      .type("");
  verb.option("-o,--output", options->files.outputs.output,
              "The folder for results, which is made; what was done is remembered in it, in the "
              "file .quenby-ledger, so that the next run goes on where this one ended")
      .required()
      .type("DIR")
      .group("Output");
  verb.option("--name", options->files.outputs.name,
              "How results are called, from {stem}, {filter} and {ext}; {stem}_{filter}.{ext} "
              "unless given")
      .type("PATTERN")
      .group("Output");
  verb.flag("--overwrite", options->files.outputs.overwrite,
            "Replace files that others left there; results of photos that change are replaced "
            "without")
      .group("Output");
  verb.flag("-n,--dry-run", options->files.outputs.planOnly,
            "Print what would become what of the photos that are there, and do nothing")
      .group("Output");
  verb.option("--settle", options->settle,
              "Milliseconds for which size and time of a file must stay the same before it counts "
              "as complete, 2000 unless given")
      .between(0, 3'600'000)
      .type("MS");
  verb.option("--every", options->every,
              "Look through the folder every so many seconds, 60 unless given, for changes that "
              "no one reports, as on network drives")
      .between(1, 86'400)
      .type("S");
  verb.flag("--once", options->once, "End when nothing is left to do");
  verb.option("--filter", options->filter, "AE0 unless given; any of `quenby looks`").type("NAME");
  options->parameters =
      FilterOptions(verb, {&filterNamed(options->filter)}, "slider=0.4;gtmOnly=true;");
  addFilteringOptions(verb, options->files);
  addLimitOptions(verb);
  verb.flag("--jsonl", options->files.report.jsonLines,
            "Print data as JSON, one object a line and photo")
      .group("Reporting");
  verb.flag("-q,--quiet", options->files.report.quiet, "Say nothing but errors").group("Reporting");
}

}  // namespace pelorin::cli
