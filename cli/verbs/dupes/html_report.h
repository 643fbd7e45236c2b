#pragma once

#include <string>
#include <vector>

#include "cli/verbs/dupes/report.h"

namespace pelorin::cli {

/// The report as one page that needs no other file and no network: every group with its photos
/// side by side, their pairs and, with a ranking, what to keep. Each photo has a box for whether it
/// stays, at least one of a group does, and the choice can be saved as a plan.
/// @param thumbnails  JPEG bytes for each photo of `report`; empty where there is no picture.
std::string htmlReport(const DupeReport& report,
                       const std::vector<std::vector<std::uint8_t>>& thumbnails);

}  // namespace pelorin::cli
