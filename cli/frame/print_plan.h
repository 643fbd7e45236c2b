#pragma once

#include <vector>

#include "cli/frame/exit_code.h"
#include "cli/frame/json_output.h"
#include "cli/frame/outputs.h"
#include "cli/frame/talk.h"

namespace pelorin::cli {

/// What JSON says of a planned file; `status` is "done", "exists", "failed" or "planned".
Json planAsJson(const PlannedFile& file, const char* status);

/// For `-n`: prints which file would become which, and says of which none can.
/// @param existing  stands behind those that are there already.
ExitCode printPlan(const std::vector<PlannedFile>& plan, const char* existing, Talk& talk,
                   JsonOutput& json);

}  // namespace pelorin::cli
