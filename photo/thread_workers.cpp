#include "photo/thread_workers.h"

#include <algorithm>
#include <exception>

namespace pelorin::photo {

struct ThreadWorkers::Job {
  const Task& task;
  std::size_t tasks;
  std::size_t begun = 0;
  std::size_t working = 0;  // tasks that have begun and not ended
  std::exception_ptr error = nullptr;
};

ThreadWorkers::ThreadWorkers(std::size_t count) {
  if (count == 0) count = std::max(1u, std::thread::hardware_concurrency());
  threads_.reserve(count - 1);
  try {
    while (threads_.size() + 1 < count) threads_.emplace_back([this] { serve(); });
  } catch (...) {
    stop();
    throw;
  }
}

ThreadWorkers::~ThreadWorkers() {
  stop();
}

void ThreadWorkers::stop() {
  {
    const std::lock_guard lock(mutex_);
    stopped_ = true;
  }
  wanted_.notify_all();
  for (std::thread& thread : threads_) thread.join();
}

void ThreadWorkers::run(std::size_t tasks, const Task& task) {
  if (tasks == 0) return;
  Job job = {task, tasks};
  std::unique_lock lock(mutex_);
  jobs_.push_back(&job);
  const std::size_t helpers = std::min(tasks - 1, threads_.size());
  for (std::size_t i = 0; i < helpers; ++i) wanted_.notify_one();
  workOn(job, lock);
  ended_.wait(lock, [&] { return job.working == 0; });
  if (job.error != nullptr) std::rethrow_exception(job.error);
}

void ThreadWorkers::serve() {
  std::unique_lock lock(mutex_);
  while (true) {
    wanted_.wait(lock, [this] { return stopped_ || !jobs_.empty(); });
    if (stopped_) return;
    workOn(*jobs_.front(), lock);
  }
}

// Ends, with the lock, when the job has no task left to begin and is not in `jobs_` any more. It
// lives as long as a task of it has not ended, or the lock is not given back since.
void ThreadWorkers::workOn(Job& job, std::unique_lock<std::mutex>& lock) {
  const auto isExhausted = [&] { return job.begun >= job.tasks; };
  while (!isExhausted()) {
    const std::size_t i = job.begun++;
    if (isExhausted()) std::erase(jobs_, &job);
    ++job.working;
    lock.unlock();
    std::exception_ptr error;
    try {
      job.task(i);
    } catch (...) {
      error = std::current_exception();
    }
    lock.lock();
    if (error != nullptr) {
      if (job.error == nullptr) job.error = error;
      if (!isExhausted()) std::erase(jobs_, &job);
      job.begun = job.tasks;
    }
    if (--job.working == 0) ended_.notify_all();
  }
}

}  // namespace pelorin::photo
