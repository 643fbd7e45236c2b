#pragma once

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <mutex>
#include <stop_token>
#include <thread>

namespace pelorin::photo {

/// Stops work that takes too long: its token says stop once the time is over, or when another token does.
/// What is at work notices between two of its steps. Runs a thread of its own, but in WebAssembly, which has one
/// alone and whose tokens look at the clock themselves.
class TimeLimit {
 public:
  /// Counts from here on.
  /// @param outer  looked at fifty times a second; nobody registers with it.
  /// @throws std::system_error when the thread cannot be started.
  explicit TimeLimit(std::chrono::milliseconds most, std::stop_token outer = {});
  ~TimeLimit();
  TimeLimit(const TimeLimit&) = delete;
  TimeLimit& operator=(const TimeLimit&) = delete;

  std::stop_token token() const { return source_.get_token(); }
  /// Whether the time was over before this was destroyed.
#ifdef __EMSCRIPTEN__
  bool passed() const {
    return std::chrono::steady_clock::now() >= end_;
  }
#else
  bool passed() const {
    return passed_;
  }
#endif

 private:
#ifdef __EMSCRIPTEN__
  std::chrono::steady_clock::time_point end_;
  std::stop_source source_;
#else
  void watch(std::chrono::milliseconds most, const std::stop_token& outer);

  std::stop_source source_;
  std::atomic<bool> passed_ = false;
  std::mutex mutex_;
  std::condition_variable end_;
  bool ended_ = false;
  std::thread watcher_;  // last, so that it finds all else
#endif
};

}  // namespace pelorin::photo
