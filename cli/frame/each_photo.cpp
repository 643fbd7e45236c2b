#include "cli/frame/each_photo.h"

#include <exception>

#include "cli/frame/errors.h"
#include "cli/frame/interrupt.h"
#include "cli/frame/jobs.h"
#include "cli/frame/limits.h"

namespace pelorin::cli {

ExitCode PhotoTally::exitCode(Talk& talk) const {
  if (interrupted) return ExitCode::interrupted;
  if (photos == 0) {
    talk.note("no photos found");
    return ExitCode::nothingToDo;
  }
  return failed > 0 ? ExitCode::someFailed : ExitCode::allDone;
}

PhotoTally runPhotoLoop(const std::vector<Input>& photos, int jobs, Talk& talk,
                        const PhotoLoop& loop) {
  std::vector<std::optional<std::string>> reasons(photos.size());
  PhotoTally tally = {.photos = photos.size()};
  const auto work = [&](std::size_t index) {
    if (!photos[index].trouble.empty()) {
      reasons[index] = photos[index].trouble;
      return;
    }
    const TimeLimited limited(limits().seconds);
    try {
      stopIfInterrupted();
      loop.work(index);
    } catch (const Interrupted&) {
      if (!limited.passed()) throw;
      reasons[index] = loop.failure + "takes longer than " + std::to_string(limits().seconds) +
                       " s; raise --timeout";
    } catch (const std::exception& error) {
      reasons[index] = loop.failure + explain(error);
    }
  };
  const auto report = [&](std::size_t index) {
    if (!reasons[index]) {
      ++tally.done;
      loop.done(index);
    } else {
      ++tally.failed;
      talk.error(photos[index].shownName(), *reasons[index]);
      if (loop.failed) loop.failed(index, *reasons[index]);
    }
    talk.fileDone();
  };
  tally.interrupted = !runJobs(photos.size(), jobs, work, report);
  return tally;
}

}  // namespace pelorin::cli
