#include "platform/pn/log.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>

namespace {

using testing::internal::CaptureStderr;
using testing::internal::GetCapturedStderr;

class Log : public testing::Test {
 protected:
  ~Log() override { pn_setLogPriority(4); }
};

constexpr const char* linePattern = R"([0-9][0-9]-[0-9][0-9] [0-9:]+\.[0-9][0-9][0-9] )";

TEST_F(Log, WritesTimeLetterTagAndText) {
  CaptureStderr();
  pn_printLog(6, "QuenbyLib", "failed: %d %s", -3, "badly");
  EXPECT_THAT(GetCapturedStderr(),
              testing::MatchesRegex(std::string(linePattern) + "E QuenbyLib: failed: -3 badly\n"));
}

TEST_F(Log, HasALetterForEveryPriority) {
  pn_setLogPriority(0);
  const std::string letters = "?VDIWEF?";
  for (int priority = 1; priority <= 8; ++priority) {
    CaptureStderr();
    pn_printLog(priority, "tag", "text");
    EXPECT_THAT(GetCapturedStderr(),
                testing::HasSubstr(std::string() + " " + letters[priority - 1] + " tag: text\n"));
  }
}

TEST_F(Log, IsQuietBelowItsPriority) {
  CaptureStderr();
  pn_printLog(3, "tag", "progress");
  EXPECT_EQ(GetCapturedStderr(), "");
  pn_setLogPriority(3);
  CaptureStderr();
  pn_printLog(3, "tag", "progress");
  pn_printLog(2, "tag", "more");
  EXPECT_THAT(GetCapturedStderr(), testing::EndsWith(" D tag: progress\n"));
  pn_setLogPriority(8);
  CaptureStderr();
  pn_printLog(7, "tag", "fatal");
  EXPECT_EQ(GetCapturedStderr(), "");
}

TEST_F(Log, CutsALongLineAndKeepsItsEnd) {
  CaptureStderr();
  pn_printLog(6, "tag", "%s", std::string(5000, 'x').c_str());
  const std::string line = GetCapturedStderr();
  EXPECT_LE(line.size(), 1200u);
  EXPECT_GE(line.size(), 1000u);
  EXPECT_THAT(line, testing::EndsWith("xxx\n"));
}

TEST_F(Log, EscapesControlCharacters) {
  CaptureStderr();
  pn_printLog(6, "tag", "%s", "a\nb\r\t\x1b[2J\x7f \xC2\x9B\xC2\xA0\xC3\xA4\\.jpg\xC2");
  EXPECT_THAT(GetCapturedStderr(),
              testing::EndsWith(
                  "E tag: a\\x0ab\\x0d\\x09\\x1b[2J\\x7f \\u009b\xC2\xA0\xC3\xA4\\.jpg\xC2\n"));
}

TEST_F(Log, CutsALineOfEscapesBetweenThem) {
  CaptureStderr();
  pn_printLog(6, "tag", "%s", std::string(5000, '\n').c_str());
  const std::string line = GetCapturedStderr();
  EXPECT_LE(line.size(), 1200u);
  EXPECT_GE(line.size(), 1000u);
  EXPECT_THAT(line, testing::EndsWith("\\x0a\\x0a\n"));
}

TEST_F(Log, CutsALongTag) {
  CaptureStderr();
  pn_printLog(6, std::string(3000, 't').c_str(), "text");
  EXPECT_THAT(GetCapturedStderr(), testing::EndsWith("ttt: text\n"));
}

}  // namespace
