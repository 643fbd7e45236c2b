#include "cli/frame/jobs.h"

#include <gtest/gtest.h>

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
