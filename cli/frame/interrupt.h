#pragma once

#include <cstdint>
#include <optional>
#include <stop_token>

#include "photo/photo_error.h"
#include "photo/time_limit.h"

namespace pelorin::cli {

/// Thrown by work that stops because of Ctrl-C.
using Interrupted = photo::Stopped;

/// From here on SIGINT and SIGTERM set a mark, for work to stop and tell what is finished. Half a
/// second later, or on a second one, the process ends wherever it is; no file is left half-written.
void installInterruptHandler();

/// What a forced end still writes to standard output, such as the end of a list; null for nothing. The
/// text lives on.
void setLastWords(const char* text);

/// While it lives, what its thread does has so much time: `interruptToken` then says stop.
class TimeLimited {
 public:
  /// @param seconds  0 for as long as it takes.
  explicit TimeLimited(std::uint32_t seconds);
  ~TimeLimited();
  TimeLimited(const TimeLimited&) = delete;
  TimeLimited& operator=(const TimeLimited&) = delete;

  bool passed() const { return limit_ && limit_->passed(); }

 private:
  std::optional<photo::TimeLimit> limit_;
};

/// The mark, for work that is asked to stop by a token. Threads whose time is limited have their own,
/// which follows it.
std::stop_token interruptToken();

/// Whether the command was asked to stop, whatever the time. Any thread may ask.
bool interruptRequested();

/// To be called between the steps of a job.
/// @throws Interrupted when the command was asked to stop, or this thread's time is over.
void stopIfInterrupted();

}  // namespace pelorin::cli
