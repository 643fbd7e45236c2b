#include "cli/frame/jobs.h"

#include <algorithm>
#include <condition_variable>
#include <mutex>
#include <thread>
#include <vector>

namespace pelorin::cli {

int jobsAtOnce(int atOnce) {
  if (atOnce != 0) return atOnce;
  return static_cast<int>(std::max(1u, std::thread::hardware_concurrency()));
}

std::size_t threadsForEach(int threads, int jobs, std::size_t files) {
  const std::size_t cores = std::max(1u, std::thread::hardware_concurrency());
  const std::size_t atOnce = std::clamp<std::size_t>(files, 1, jobsAtOnce(jobs));
  const std::size_t most = std::max<std::size_t>(1, cores / atOnce);
  if (threads == usualThreads) return files <= 1 ? most : 1;
  return threads == 0 ? most : std::min<std::size_t>(threads, most);
}

bool runJobs(std::size_t count, int atOnce, const std::function<void(std::size_t)>& work,
             const std::function<void(std::size_t)>& report) {
  atOnce = jobsAtOnce(atOnce);
  std::mutex mutex;
  std::condition_variable changed;
  std::size_t next = 0;
  std::size_t working = std::min<std::size_t>(atOnce, count);
  std::vector<bool> done(count);

  const auto worker = [&] {
    std::unique_lock lock(mutex);
    while (next < count && !interruptRequested()) {
      const std::size_t index = next++;
      lock.unlock();
      bool finished = true;
      try {
        work(index);
      } catch (const Interrupted&) {
        finished = false;
      }
      lock.lock();
      done[index] = finished;
      changed.notify_one();
    }
    --working;
    changed.notify_one();
  };
  std::vector<std::jthread> threads;
  for (std::size_t i = working; i > 0; --i) threads.emplace_back(worker);

  bool all = true;
  for (std::size_t index = 0; index < count; ++index) {
    std::unique_lock lock(mutex);
    changed.wait(lock, [&] { return done[index] || working == 0; });
    const bool reportable = done[index];
    lock.unlock();
    if (reportable) report(index);
    all = all && reportable;
  }
  return all;
}

}  // namespace pelorin::cli
