#pragma once

#include <functional>
#include <map>
#include <string>
#include <vector>

#include "cli/frame/coding_option.h"
#include "cli/frame/exit_code.h"
#include "cli/frame/face_choice.h"
#include "cli/frame/inputs.h"
#include "cli/frame/jobs.h"
#include "cli/frame/keep_option.h"
#include "cli/frame/mark_option.h"
#include "cli/frame/memory_option.h"
#include "cli/frame/outputs.h"
#include "cli/frame/talk.h"
#include "cli/frame/verb.h"
#include "image_processing/filters/filter_description.h"

namespace pelorin::cli {

/// The options of every verb that makes filtered files of files.
struct FilterFilesOptions {
  InputOptions inputs;
  OutputOptions outputs;
  ReportOptions report;
  CodingChoice coding;
  KeepChoice keep;
  MarkChoice mark;
  FaceOptions faces;
  std::string raw;
  std::string page;  ///< Where before and after are to be shown; empty for nowhere.
  int rotate = 0;
  int scale = 1;
  int jobs = 0;
  int threads = usualThreads;  ///< On each file.
  int memory = usualMemory;    ///< MiB of pixels kept, by all jobs together.
};

/// Adds what a verb may do with a photo beside the filter: faces, turning, quality, metadata, jobs.
void addFilteringOptions(Verb verb, FilterFilesOptions& options);

/// Adds all of them to a verb. Results in a folder are called `{stem}_{filter}` by default.
/// @param placeholders  what `--name` may hold, for the help.
void addFilterFilesOptions(Verb verb, FilterFilesOptions& options,
                           const std::string& placeholders = "{stem}, {filter} and {ext}");

/// What to do with every file.
struct FilterToApply {
  const image_processing::FilterDescription& filter;
  std::string params;                         ///< As the filter reads it; already checked.
  std::map<std::string, std::string> values;  ///< For `--name`, beside {stem} and {filter}.
  std::string doneAlready;                    ///< What is said of a photo that carries its mark.
};

/// For who wants to know of each file, on the calling thread; both may be empty.
struct FileListener {
  /// Called once, before any work.
  std::function<void(const std::vector<PlannedFile>& plan)> planned = {};
  /// Called for each file in order, with what became of it ("done", "exists", "edited" or "failed") and
  /// what of its metadata was lost.
  std::function<void(const PlannedFile& file, const std::string& status,
                     const std::vector<photo::Loss>& lost)>
      told = {};
};

/// Plans, then loads, filters and saves every file, reports, and says how it went.
/// @throws UsageError before any work.
ExitCode filterFiles(const std::string& verb, FilterFilesOptions options,
                     const FilterToApply& filter, const FileListener& listener = {});

}  // namespace pelorin::cli
