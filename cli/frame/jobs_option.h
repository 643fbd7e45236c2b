#pragma once

#include "cli/frame/verb.h"

namespace pelorin::cli {

/// Adds `-j N` to a verb: `atOnce` unless given, 0 for one a core.
void addJobsOption(Verb verb, int& atOnce);

/// Adds `--threads N` to a verb, what `threadsForEach` takes.
void addThreadsOption(Verb verb, int& threads);

}  // namespace pelorin::cli
