#pragma once

#include <cstddef>
#include <functional>

#include "cli/frame/interrupt.h"

namespace pelorin::cli {

/// How many that is: `atOnce`, or one a core for 0.
int jobsAtOnce(int atOnce);

/// `--threads` where it is not given.
inline constexpr int usualThreads = -1;

/// How many threads work on each of some files: as `--threads` says, 0 for all that there are; unless
/// given all for one file, and one for each of several. Together they are never more than the cores,
/// as long as there are not more jobs.
/// @param jobs  as `-j` says.
std::size_t threadsForEach(int threads, int jobs, std::size_t files);

/// Runs `work(0)` ... `work(count - 1)`, `atOnce` of them at the same time, each on one thread, and
/// calls `report` on the calling thread in that order, as soon as the order allows. Ctrl-C starts
/// no further work; what was done by then is reported.
/// @param work  may throw Interrupted and nothing else.
/// @returns false when interrupted.
bool runJobs(std::size_t count, int atOnce, const std::function<void(std::size_t)>& work,
             const std::function<void(std::size_t)>& report);

}  // namespace pelorin::cli
