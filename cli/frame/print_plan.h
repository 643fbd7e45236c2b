#pragma once

#include <string>
#include <vector>

#include "cli/frame/exit_code.h"
#include "cli/frame/json_output.h"
#include "cli/frame/outputs.h"
#include "cli/frame/talk.h"

namespace pelorin::cli {

/// What JSON says of a planned file; `status` is "done", "exists", "edited", "failed" or "planned".
Json planAsJson(const PlannedFile& file, const char* status);

/// For `-n`: prints which file would become which, and says of which none can.
/// @param existing  stands behind those that are there already.
/// @param edited    is said of those that carry the mark of the same edit.
ExitCode printPlan(const std::vector<PlannedFile>& plan, const char* existing,
                   const std::string& edited, Talk& talk, JsonOutput& json);

}  // namespace pelorin::cli
