#include "photo/time_limit.h"

#include <gtest/gtest.h>

namespace pelorin::photo {
namespace {

using namespace std::chrono_literals;

void waitFor(const std::stop_token& token) {
  while (!token.stop_requested()) std::this_thread::sleep_for(1ms);
}

TEST(TimeLimit, SaysStopWhenTheTimeIsOver) {
  const TimeLimit limit(1ms);
  waitFor(limit.token());
  EXPECT_TRUE(limit.passed());
}

TEST(TimeLimit, SaysStopWhenAnotherTokenDoes) {
  std::stop_source outer;
  const TimeLimit limit(std::chrono::milliseconds::max(), outer.get_token());
  EXPECT_FALSE(limit.token().stop_requested());
  outer.request_stop();
  waitFor(limit.token());
  EXPECT_FALSE(limit.passed());
}

TEST(TimeLimit, EndsWithWhatItLimits) {
  std::stop_token token;
  {
    const TimeLimit limit(std::chrono::hours(24));
    token = limit.token();
  }
  EXPECT_FALSE(token.stop_requested());
}

}  // namespace
}  // namespace pelorin::photo
