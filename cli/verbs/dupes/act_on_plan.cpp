#include "cli/verbs/dupes/act_on_plan.h"

#include <fmt/format.h>

#include <filesystem>
#include <system_error>

#include "cli/frame/each_photo.h"
#include "cli/frame/errors.h"
#include "cli/frame/json_output.h"
#include "cli/frame/used_files.h"
#include "photo/backup.h"

namespace fs = std::filesystem;

namespace pelorin::cli {
namespace {

struct Action {
  const photo::Removal& removal;
  const photo::KnownFile& file;
};

/// What became of a file, or would.
struct Outcome {
  const char* status;
  std::string place;  // where it goes, or what it becomes a name of; empty where it stays
};

std::string placeIn(const std::string& folder, const std::string& path) {
  return (fs::path(folder) / fs::path(path).relative_path()).string();
}

Outcome move(const Action& action, const ActionOptions& options) {
  if (options.apply) photo::moveToBackups(options.moveTo, action.file.path);
  return {options.apply ? "moved" : "planned", placeIn(options.moveTo, action.file.path)};
}

Outcome link(const Action& action, const ActionOptions& options) {
  const photo::KnownFile* const same = photo::sameBytes(action.removal, action.file);
  if (same == nullptr) return {"different", ""};
  if (fs::equivalent(same->path, action.file.path)) return {"linked already", same->path};
  if (options.apply) photo::linkTo(*same, action.file, options.backup);
  return {options.apply ? "linked" : "planned", same->path};
}

Outcome act(const Action& action, const ActionOptions& options) {
  photo::checkRemoval(action.removal, action.file);
  return options.link ? link(action, options) : move(action, options);
}

void checkFolder(const char* option, const std::string& folder, const std::vector<Input>& inputs) {
  std::error_code failed;
  if (fs::exists(folder, failed) && !photo::isBackupFolder(folder)) {
    throw UsageError(fmt::format("{}: {} holds other files; name a new folder", option, folder));
  }
  const fs::path kept = fs::weakly_canonical(folder, failed);
  for (const Input& input : inputs) {
    const fs::path below = fs::weakly_canonical(input.path, failed).lexically_relative(kept);
    if (!below.empty() && *below.begin() != "..") {
      throw UsageError(fmt::format("{}: {} is in that folder; choose another one", option,
                                   shownName(input.path)));
    }
  }
}

}  // namespace

void addActionOptions(Verb verb, ActionOptions& options) {
  verb.option("--move-to", options.moveTo,
              "Move the photos that need not be kept into this folder, under the whole paths they "
              "had; quenby undo DIR puts them back. Only says so without --apply")
      .type("DIR")
      .group("Acting");
  verb.flag("--link", options.link,
            "Make photos whose every byte is that of one to keep another name of it (a hard link), "
            "and leave the rest; needs --backup or --no-backup. Only says so without --apply")
      .group("Acting");
  verb.option("--backup", options.backup,
              "Keep what --link replaces in this folder, with times, permissions and attributes; "
              "quenby undo DIR puts it back")
      .type("DIR")
      .group("Acting");
  verb.flag("--no-backup", options.noBackup, "Link for good, which frees the space at once")
      .group("Acting");
  verb.flag("--apply", options.apply, "Do what --move-to or --link says").group("Acting");
}

void checkActions(const ActionOptions& options, const std::vector<Input>& inputs) {
  if (!options.link && (options.noBackup || !options.backup.empty())) {
    throw UsageError("--backup and --no-backup are for --link");
  }
  if (!options.wanted()) {
    if (options.apply) throw UsageError("--apply: say what to do, with --move-to DIR or --link");
    return;
  }
  if (options.link && !options.moveTo.empty()) {
    throw UsageError("--move-to and --link: a photo that is moved is not linked; choose one");
  }
  if (options.link && options.noBackup == !options.backup.empty()) {
    throw UsageError("--link: add --backup DIR to be able to undo it, or --no-backup");
  }
  if (!options.moveTo.empty()) checkFolder("--move-to", options.moveTo, inputs);
  if (!options.backup.empty()) checkFolder("--backup", options.backup, inputs);
}

ExitCode actOnPlan(const std::vector<photo::Removal>& plan, const ActionOptions& options,
                   const ReportOptions& report) {
  std::vector<Action> actions;
  std::vector<Input> files;
  std::vector<std::string> paths;
  for (const photo::Removal& removal : plan) {
    for (const photo::KnownFile& file : removal.removed) {
      actions.push_back({removal, file});
      files.push_back({file.path, {}});
      paths.push_back(file.path);
    }
  }
  if (options.apply) sweepFolders(paths);
  JsonOutput json(report, /*singleFile=*/false);
  Talk talk("dupes", report, files.size());
  const char* const verb = options.link ? "link" : "move";
  const auto told = [&](std::size_t index, const Outcome& outcome) {
    Json object = {{"file", files[index].path}, {"action", verb}, {"status", outcome.status}};
    if (!outcome.place.empty()) object[options.link ? "linkTo" : "to"] = outcome.place;
    return object;
  };
  std::size_t left = 0;
  const PhotoTally tally =
      eachPhoto<Outcome>(files, /*jobs=*/1, talk,
                         {.work = [&](std::size_t index) { return act(actions[index], options); },
                          .done =
                              [&](std::size_t index, const Outcome& outcome) {
                                json.add(told(index, outcome));
                                if (outcome.place.empty()) ++left;
                                if (json.wanted() || outcome.place.empty()) return;
                                fmt::print("{} {} {}\n", shownName(files[index].path),
                                           options.link ? "=" : "->", shownName(outcome.place));
                              },
                          .failed =
                              [&](std::size_t index, const std::string& reason) {
                                Json object = told(index, {"failed", ""});
                                object["error"] = reason;
                                json.add(object);
                              }});
  if (files.empty()) {
    talk.note("no photo needs to go");
    return ExitCode::nothingToDo;
  }
  if (left > 0) {
    talk.note(
        fmt::format("{} photos are like one to keep but have other bytes; a link would lose "
                    "them, so they stay",
                    left));
  }
  const std::size_t done = tally.done - left;
  if (options.apply) {
    talk.note(fmt::format("{} photos {}", done, options.link ? "linked" : "moved"));
  } else {
    talk.note(fmt::format("{} photos would be {}; add --apply to do it", done,
                          options.link ? "linked" : "moved"));
  }
  return tally.exitCode(talk);
}

}  // namespace pelorin::cli
