#pragma once

#include <optional>
#include <string>
#include <vector>

#include "cli/frame/exit_code.h"
#include "cli/frame/inputs.h"
#include "cli/frame/json_output.h"
#include "cli/frame/talk.h"
#include "cli/frame/verb.h"

namespace pelorin::cli {

// For verbs that read one photo, or make one file of many, rather than one file an input.

/// Where such a verb's work goes.
struct LoneOutputOptions {
  std::string output;
  bool overwrite = false;
  bool planOnly = false;
  bool makesFolder = false;  ///< Where the one its files stand in is missing.
};

/// Adds `-o`, `--overwrite` and `-n` to a verb.
void addLoneOutputOptions(Verb verb, LoneOutputOptions& options, const std::string& typeName,
                          const std::string& help);

/// Adds the positional IN to a verb; `name` is for `loneInput`.
void addLoneInput(Verb verb, std::string& name);

/// The photo that a verb's only positional names.
/// @throws UsageError when it is a folder.
Input loneInput(const std::string& name);

/// Looks at the outputs before any work, and says what there is to say: that one exists already,
/// without `--overwrite`, or with `-n` what would be made.
/// @returns the exit code to stop with, or nothing when the work is to be done.
/// @throws UsageError when an output is one of the inputs or a folder, or when the folder it would
///         stand in is missing.
std::optional<ExitCode> stopBeforeWork(const std::vector<Input>& inputs,
                                       const std::vector<std::string>& outputs,
                                       const LoneOutputOptions& options, Talk& talk,
                                       JsonOutput& json);

}  // namespace pelorin::cli
