#include "photo/thread_workers.h"

#include <gtest/gtest.h>

#include <atomic>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

namespace pelorin::photo {
namespace {

TEST(ThreadWorkers, RunEachTaskOnce) {
  for (const std::size_t threads : {1, 2, 3, 8}) {
    ThreadWorkers workers(threads);
    EXPECT_EQ(workers.count(), threads);
    for (const std::size_t tasks : {0, 1, 2, 7, 100}) {
      std::vector<int> times(tasks);  // plain: tasks have ended when `run` returns
      workers.run(tasks, [&](std::size_t i) { ++times[i]; });
      EXPECT_EQ(times, std::vector<int>(tasks, 1));
    }
  }
}

TEST(ThreadWorkers, AreAsManyAsTheCoresUnlessToldOtherwise) {
  EXPECT_EQ(ThreadWorkers().count(), std::max(1u, std::thread::hardware_concurrency()));
}

// Two tasks that wait for each other end only if both are at work.
TEST(ThreadWorkers, RunTasksAtTheSameTime) {
  ThreadWorkers workers(2);
  std::atomic<int> arrived = 0;
  workers.run(2, [&](std::size_t) {
    ++arrived;
    while (arrived < 2) std::this_thread::yield();
  });
  EXPECT_EQ(arrived, 2);
}

TEST(ThreadWorkers, PassAnErrorOnWhenAllTasksHaveEnded) {
  ThreadWorkers workers(3);
  for (int round = 0; round < 50; ++round) {
    std::vector<int> ended(20);
    const auto fail = [&](std::size_t i) {
      if (i == 4) throw std::runtime_error("of a task");
      ended[i] = 1;
    };
    try {
      workers.run(ended.size(), fail);
      FAIL() << "no error";
    } catch (const std::runtime_error& error) {
      EXPECT_EQ(error.what(), std::string("of a task"));
    }
    EXPECT_EQ(ended[4], 0);
  }
  std::atomic<int> after = 0;
  workers.run(9, [&](std::size_t) { ++after; });
  EXPECT_EQ(after, 9);
}

TEST(ThreadWorkers, ServeSeveralCallersAtOnce) {
  ThreadWorkers workers(3);
  std::vector<std::thread> callers;
  std::atomic<int> wrong = 0;
  for (int caller = 0; caller < 4; ++caller) {
    callers.emplace_back([&, caller] {
      for (int round = 0; round < 100; ++round) {
        std::vector<int> done(11);
        try {
          workers.run(done.size(), [&](std::size_t i) {
            if (caller == 0 && i == 5) throw std::runtime_error("the first caller's");
            done[i] = caller;
          });
          wrong += caller == 0 || done != std::vector<int>(done.size(), caller);
        } catch (const std::runtime_error&) {
          wrong += caller != 0;
        }
      }
    });
  }
  for (std::thread& caller : callers) caller.join();
  EXPECT_EQ(wrong, 0);
}

}  // namespace
}  // namespace pelorin::photo
