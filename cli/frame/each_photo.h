#pragma once

#include <cstddef>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "cli/frame/exit_code.h"
#include "cli/frame/inputs.h"
#include "cli/frame/talk.h"

namespace pelorin::cli {

/// How a loop over photos went.
struct PhotoTally {
  std::size_t photos = 0, done = 0, failed = 0;
  bool interrupted = false;  ///< Some photos are neither done nor failed.

  /// What that means to the shell where nothing else counts; without photos, this is said as well.
  ExitCode exitCode(Talk& talk) const;
};

/// What a verb does with every photo.
template <typename Result>
struct PhotoSteps {
  /// Called with the photo's index, on any thread; what it throws is the reason why it failed.
  std::function<Result(std::size_t)> work;
  /// Called with the result, on the calling thread, in the order of the photos.
  std::function<void(std::size_t, const Result&)> done;
  /// The same for the reason, which has been said already; may be empty.
  std::function<void(std::size_t, const std::string&)> failed = {};
  /// Stands before every reason: "no picture of it: ".
  std::string failure = {};
};

/// The steps of a loop that keeps its results itself.
struct PhotoLoop {
  std::function<void(std::size_t)> work, done;
  std::function<void(std::size_t, const std::string&)> failed;
  std::string failure;
};

PhotoTally runPhotoLoop(const std::vector<Input>& photos, int jobs, Talk& talk,
                        const PhotoLoop& loop);

/// Works on photos, `jobs` at once, each on one thread: says which failed and why, moves the bar on,
/// counts. One with a trouble has failed without any work. Ctrl-C starts no further work; what was done
/// by then is reported.
template <typename Result>
PhotoTally eachPhoto(const std::vector<Input>& photos, int jobs, Talk& talk,
                     const PhotoSteps<Result>& steps) {
  std::vector<std::optional<Result>> results(photos.size());
  return runPhotoLoop(photos, jobs, talk,
                      {[&](std::size_t index) { results[index] = steps.work(index); },
                       [&](std::size_t index) {
                         steps.done(index, *results[index]);
                         results[index].reset();
                       },
                       steps.failed, steps.failure});
}

}  // namespace pelorin::cli
