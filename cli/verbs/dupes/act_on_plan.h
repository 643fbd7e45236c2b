#pragma once

#include <string>
#include <vector>

#include "cli/frame/exit_code.h"
#include "cli/frame/inputs.h"
#include "cli/frame/talk.h"
#include "cli/frame/verb.h"
#include "photo/collection/removal.h"

namespace pelorin::cli {

/// What becomes of the photos that need not be kept.
struct ActionOptions {
  std::string moveTo;  ///< A folder.
  bool link = false;
  std::string backup;  ///< A folder, for `link`.
  bool noBackup = false;
  bool apply = false;  ///< Else nothing is done, only said.

  bool wanted() const { return link || !moveTo.empty(); }
};

/// Adds `--move-to`, `--link`, `--backup`, `--no-backup` and `--apply`.
void addActionOptions(Verb verb, ActionOptions& options);

/// @throws UsageError where the options contradict one another or the inputs.
void checkActions(const ActionOptions& options, const std::vector<Input>& inputs);

/// Moves or links every photo of the plan that may go, or says what would become of it.
ExitCode actOnPlan(const std::vector<photo::Removal>& plan, const ActionOptions& options,
                   const ReportOptions& report);

}  // namespace pelorin::cli
