#pragma once

#include <condition_variable>
#include <cstddef>
#include <deque>
#include <mutex>
#include <thread>
#include <vector>

#include "image_processing/core/workers.h"

namespace pelorin::photo {

/// Workers on threads of their own, which sleep while there is nothing to do. Any thread may use
/// them, several at once as well; they are to be idle when they are destroyed.
class ThreadWorkers : public image_processing::Workers {
 public:
  /// @param count  the calling thread included, so that one fewer is started; 0 for as many as the
  ///               process has cores.
  /// @throws std::system_error when a thread cannot be started; std::bad_alloc.
  explicit ThreadWorkers(std::size_t count = 0);
  ~ThreadWorkers() override;
  ThreadWorkers(const ThreadWorkers&) = delete;
  ThreadWorkers& operator=(const ThreadWorkers&) = delete;

  std::size_t count() const override { return threads_.size() + 1; }
  void run(std::size_t tasks, const Task& task) override;

 private:
  struct Job;

  void serve();
  void workOn(Job& job, std::unique_lock<std::mutex>& lock);
  void stop();

  std::mutex mutex_;  // guards all below but the threads, and every job
  std::condition_variable wanted_, ended_;
  std::deque<Job*> jobs_;  // that have tasks which did not begin
  bool stopped_ = false;
  std::vector<std::thread> threads_;
};

}  // namespace pelorin::photo
