#pragma once

#include <cstddef>
#include <exception>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "cli/frame/errors.h"
#include "cli/frame/interrupt.h"
#include "cli/frame/verb.h"

namespace pelorin::cli {

/// Adds `-j N` to a verb: 1 unless given, 0 for one a core.
void addJobsOption(Verb verb, int& atOnce);

/// Runs `work(0)` ... `work(count - 1)`, `atOnce` of them at the same time, each on one thread, and
/// calls `report` on the calling thread in that order, as soon as the order allows. Ctrl-C starts
/// no further work; what was done by then is reported.
/// @param work  may throw Interrupted and nothing else.
/// @returns false when interrupted.
bool runJobs(std::size_t count, int atOnce, const std::function<void(std::size_t)>& work,
             const std::function<void(std::size_t)>& report);

/// What became of one file: a result, or the clause that says why there is none.
template <typename Result>
struct Attempt {
  std::optional<Result> result;
  std::string error;
};

/// `runJobs` for work that returns a result or throws.
/// @param work    called with the index, on any thread; what it throws becomes the error.
/// @param report  called with the index and the attempt, on the calling thread, in order.
template <typename Result>
bool attemptJobs(std::size_t count, int atOnce, const std::function<Result(std::size_t)>& work,
                 const std::function<void(std::size_t, const Attempt<Result>&)>& report) {
  std::vector<Attempt<Result>> attempts(count);
  return runJobs(
      count, atOnce,
      [&](std::size_t index) {
        try {
          attempts[index].result = work(index);
        } catch (const Interrupted&) {
          throw;
        } catch (const std::exception& error) {
          attempts[index].error = explain(error);
        }
      },
      [&](std::size_t index) {
        report(index, attempts[index]);
        attempts[index] = {};
      });
}

}  // namespace pelorin::cli
