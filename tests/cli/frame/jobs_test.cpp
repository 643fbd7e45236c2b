#include "cli/frame/jobs.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <mutex>
#include <numeric>
#include <set>
#include <thread>

namespace pelorin::cli {
namespace {

TEST(Jobs, AreReportedInOrderHoweverManyRunAtOnce) {
  for (const int atOnce : {0, 1, 2, 7, 64}) {
    std::vector<std::size_t> reported;
    std::atomic<int> worked = 0;
    EXPECT_TRUE(runJobs(
        50, atOnce, [&](std::size_t) { ++worked; },
        [&](std::size_t index) { reported.push_back(index); }));
    std::vector<std::size_t> expected(50);
    std::iota(expected.begin(), expected.end(), 0u);
    EXPECT_EQ(reported, expected);
    EXPECT_EQ(worked, 50);
  }
}

TEST(Jobs, OfNoneAreFinished) {
  EXPECT_TRUE(runJobs(
      0, 4, [](std::size_t) { FAIL(); }, [](std::size_t) { FAIL(); }));
}

TEST(ThreadsForEach, AreAllCoresForOneFileAndOneForEachOfSeveral) {
  const std::size_t cores = std::max(1u, std::thread::hardware_concurrency());
  EXPECT_EQ(threadsForEach(usualThreads, 1, 1), cores);
  EXPECT_EQ(threadsForEach(usualThreads, 0, 1), cores);
  EXPECT_EQ(threadsForEach(usualThreads, 1, 5), 1u);
  EXPECT_EQ(threadsForEach(usualThreads, 0, 5), 1u);
}

TEST(ThreadsForEach, AreNeverMoreThanTheCoresForAllFilesAtOnce) {
  const std::size_t cores = std::max(1u, std::thread::hardware_concurrency());
  for (const int threads : {0, 1, 2, 3, 1000}) {
    for (const int jobs : {0, 1, 2, 1000}) {
      for (const std::size_t files : {1, 2, 100}) {
        const std::size_t each = threadsForEach(threads, jobs, files);
        const auto atOnce = std::min<std::size_t>(jobsAtOnce(jobs), files);
        EXPECT_LE(each * std::min(atOnce, cores), cores);
        EXPECT_GE(each, 1u);
        EXPECT_TRUE(threads == 0 || each <= static_cast<std::size_t>(threads));
      }
    }
  }
  EXPECT_EQ(threadsForEach(0, 1, 9), cores);
}

TEST(Jobs, AreReportedOnTheCallingThread) {
  const std::thread::id here = std::this_thread::get_id();
  runJobs(
      8, 2, [](std::size_t) {},
      [here](std::size_t) { EXPECT_EQ(std::this_thread::get_id(), here); });
}

TEST(Jobs, ReportWhatTheOthersDidWhenOneIsInterrupted) {
  std::vector<std::size_t> reported;
  EXPECT_FALSE(runJobs(
      4, 2,
      [](std::size_t index) {
        if (index == 1) throw Interrupted();
      },
      [&](std::size_t index) { reported.push_back(index); }));
  EXPECT_EQ(reported, (std::vector<std::size_t>{0, 2, 3}));
}

}  // namespace
}  // namespace pelorin::cli
