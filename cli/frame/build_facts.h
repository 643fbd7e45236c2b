#pragma once

#include "cli/frame/json_output.h"

namespace pelorin::cli {

/// What `--version --json` says: version, compiler, instruction sets, libraries.
Json buildFacts();

}  // namespace pelorin::cli
