#pragma once

#include <string>
#include <vector>

#include "cli/frame/json_output.h"
#include "photo/collection/removal.h"

namespace pelorin::cli {

// A plan as a file, which the page of a report writes and `--plan` reads:
//   {"schema": 1, "plan": "dupes", "groups": [{"keep": [FILE, ...], "remove": [FILE, ...]}]}
// with FILE {"file": path, "bytes": size, "modified": nanoseconds since 1970 as text}, and
// "fileBase64" beside a path that is no UTF-8.

/// FILE of a plan, as text in ASCII.
std::string planEntry(const photo::KnownFile& file);

/// Reads a plan.
/// @throws UsageError where the file cannot be read or is none, naming the place.
std::vector<photo::Removal> readPlan(const std::string& path);

}  // namespace pelorin::cli
