#include "platform/pnjni/java_message.h"

#include <gtest/gtest.h>

#include <string>

namespace pelorin::jni {
namespace {

TEST(JavaMessage, KeepsWhatIsModifiedUtf8) {
  for (const char* text : {"", "plain", "na\xC3\xAFve", "\xE5\x86\x99\xE7\x9C\x9F"})
    EXPECT_STREQ(JavaMessage(text).c_str(), text);
}

TEST(JavaMessage, ReplacesWhatIsNot) {
  EXPECT_STREQ(JavaMessage("caf\xE9").c_str(), "caf?");            // Latin-1
  EXPECT_STREQ(JavaMessage("a\xF0\x9F\x93\xB7z").c_str(), "a?z");  // beyond the basic plane
  EXPECT_STREQ(JavaMessage("\x80\x80z").c_str(), "?z");            // continuation alone
  EXPECT_STREQ(JavaMessage("\xE5\x86").c_str(), "?");              // cut character
  EXPECT_STREQ(JavaMessage("\xC0\xAFz").c_str(), "?z");            // overlong
}

TEST(JavaMessage, IsCutBetweenCharacters) {
  std::string text;
  for (int i = 0; i < 600; ++i) text += "\xE5\x86\x99";
  const std::string cut = JavaMessage(text.c_str()).c_str();
  EXPECT_EQ(cut.size(), 1002u);
  EXPECT_EQ(cut, text.substr(0, 1002));
}

}  // namespace
}  // namespace pelorin::jni
