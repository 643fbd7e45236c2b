#pragma once

#include <cstddef>
#include <functional>

#include "cli/frame/interrupt.h"
#include "cli/frame/verb.h"

namespace pelorin::cli {

/// Adds `-j N` to a verb: `atOnce` unless given, 0 for one a core.
void addJobsOption(Verb verb, int& atOnce);

/// How many that is: `atOnce`, or one a core for 0.
int jobsAtOnce(int atOnce);

/// Runs `work(0)` ... `work(count - 1)`, `atOnce` of them at the same time, each on one thread, and
/// calls `report` on the calling thread in that order, as soon as the order allows. Ctrl-C starts
/// no further work; what was done by then is reported.
/// @param work  may throw Interrupted and nothing else.
/// @returns false when interrupted.
bool runJobs(std::size_t count, int atOnce, const std::function<void(std::size_t)>& work,
             const std::function<void(std::size_t)>& report);

}  // namespace pelorin::cli
