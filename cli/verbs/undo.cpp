#include <fmt/format.h>

#include <memory>
#include <string>
#include <vector>

#include "cli/frame/each_photo.h"
#include "cli/frame/errors.h"
#include "cli/frame/json_output.h"
#include "cli/frame/shown_text.h"
#include "cli/frame/talk.h"
#include "cli/verbs/verbs.h"
#include "photo/backup.h"

namespace pelorin::cli {
namespace {

struct UndoOptions {
  std::string folder;
  bool planOnly = false, force = false;
  ReportOptions report;
};

ExitCode runUndo(const UndoOptions& options) {
  if (!photo::isBackupFolder(options.folder)) {
    throw UsageError(options.folder +
                     ": is no folder of backups; name the one given with --backup or "
                     "--move-to");
  }
  std::vector<Input> files;
  for (const std::string& path : photo::keptFiles(options.folder)) files.push_back({path, {}});
  JsonOutput json(options.report, /*singleFile=*/false);
  Talk talk("undo", options.report, files.size());
  const char* const status = options.planOnly ? "planned" : "restored";
  const PhotoTally tally = eachPhoto<bool>(
      files, /*jobs=*/1, talk,
      {.work =
           [&](std::size_t index) {
             if (!options.force && photo::isChangedSince(options.folder, files[index].path)) {
               throw FileError(
                   "was changed by another program since; save it elsewhere, then --force puts "
                   "the old one in its place");
             }
             if (!options.planOnly) photo::restoreBackup(options.folder, files[index].path);
             return true;
           },
       .done =
           [&](std::size_t index, bool) {
             json.add({{"file", files[index].path}, {"status", status}});
             if (options.planOnly && !json.wanted()) {
               fmt::print("{}\n", shownText(files[index].path));
             }
           },
       .failed =
           [&](std::size_t index, const std::string& reason) {
             json.add({{"file", files[index].path}, {"status", "failed"}, {"error", reason}});
           }});
  if (!options.planOnly) talk.note(fmt::format("{} photos restored", tally.done));
  return tally.exitCode(talk);
}

}  // namespace

void addUndo(CommandLine& commandLine) {
  const auto options = std::make_shared<UndoOptions>();
  Verb verb = commandLine.addVerb("undo", "Put photos back that --in-place replaced or dupes moved",
                                  "quenby enhance -r holiday --in-place --backup before\n"
                                  "quenby undo before",
                                  [options] { return runUndo(*options); });
  verb.option(
          "DIR", options->folder,
          "The folder given with --backup or --move-to: every photo in it goes back where it was, "
          "with its times, permissions and attributes, and leaves the folder")
      .required()
      .type("");
  verb.flag("-n,--dry-run", options->planOnly, "Print what would go back, and do nothing");
  verb.flag("--force", options->force,
            "Also put back photos in whose place another program has left something else since, "
            "which is lost");
  addReportOptions(verb, options->report);
}

}  // namespace pelorin::cli
