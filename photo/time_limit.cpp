#include "photo/time_limit.h"

#include <algorithm>
#include <utility>

namespace pelorin::photo {

using std::chrono::milliseconds;

#ifdef __EMSCRIPTEN__
TimeLimit::TimeLimit(milliseconds most, std::stop_token outer)
    : end_(std::chrono::steady_clock::now() +
           std::min<milliseconds>(most, std::chrono::years(100))),
      source_(end_, outer) {}

TimeLimit::~TimeLimit() = default;
#else
TimeLimit::TimeLimit(milliseconds most, std::stop_token outer)
    : watcher_([this, most, outer = std::move(outer)] { watch(most, outer); }) {}

TimeLimit::~TimeLimit() {
  {
    const std::lock_guard lock(mutex_);
    ended_ = true;
  }
  end_.notify_one();
  watcher_.join();
}

void TimeLimit::watch(milliseconds most, const std::stop_token& outer) {
  using Clock = std::chrono::steady_clock;
  constexpr milliseconds betweenLooks(20), shortest(1);
  const auto start = Clock::now();
  // In milliseconds, since the longest times are more nanoseconds than there are numbers.
  const auto left = [&] {
    return most - std::chrono::duration_cast<milliseconds>(Clock::now() - start);
  };
  std::unique_lock lock(mutex_);
  while (left() > milliseconds(0) && !outer.stop_requested()) {
    // By the clock that condition variables of every glibc know.
    const auto next = std::chrono::system_clock::now() + std::clamp(left(), shortest, betweenLooks);
    if (end_.wait_until(lock, next, [this] { return ended_; })) return;
  }
  passed_ = !outer.stop_requested();
  source_.request_stop();
}
#endif

}  // namespace pelorin::photo
