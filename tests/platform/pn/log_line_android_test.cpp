#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "platform/pn/log.h"
#include "platform/pn/log_line.h"

namespace {

std::vector<std::string> lines;

}  // namespace

extern "C" int __android_log_write(int priority, const char* tag, const char* text) {
  lines.push_back(std::to_string(priority) + " " + tag + ": " + text);
  return 1;
}

namespace {

TEST(AndroidLog, GetsWhatIsPrinted) {
  testing::internal::CaptureStderr();
  pn_printLog(6, "QuenbyLib", "failed: %d", -3);
  EXPECT_EQ(lines, std::vector<std::string>{"6 QuenbyLib: failed: -3"});
  EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
}

TEST(AndroidLog, GetsNothingThatIsSilenced) {
  lines.clear();
  pn_printLog(3, "QuenbyLib", "progress");
  pn_setLogPriority(8);
  pn_printLog(7, "QuenbyLib", "fatal");
  EXPECT_TRUE(lines.empty());
  pn_setLogPriority(3);
  pn_printLog(3, "QuenbyLib", "progress");
  EXPECT_EQ(lines.size(), 1u);
  pn_setLogPriority(4);
}

TEST(AndroidLog, GetsLongLinesCut) {
  lines.clear();
  pn_printLog(6, "QuenbyLib", "%s", std::string(5000, 'x').c_str());
  ASSERT_EQ(lines.size(), 1u);
  EXPECT_GE(lines[0].size(), 1000u);
  EXPECT_LE(lines[0].size(), 1200u);
}

}  // namespace
