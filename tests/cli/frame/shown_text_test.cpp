#include "cli/frame/shown_text.h"

#include <gtest/gtest.h>

namespace pelorin::cli {
namespace {

TEST(ShownText, IsWhatItWasWhereItDoesNothing) {
  for (const char* text : {"", "a b.jpg", "caf\xC3\xA9 \xE2\x82\xAC \xF0\x9F\x98\x80", "a\\n"}) {
    EXPECT_EQ(shownText(text), text);
  }
}

TEST(ShownText, SpellsOutWhatATerminalWouldObey) {
  EXPECT_EQ(shownText("\x1b[2Ja\r\n\tb\x7f"), "\\x1b[2Ja\\r\\n\\tb\\x7f");
  EXPECT_EQ(shownText(std::string_view("a\0b", 3)), "a\\x00b");
  EXPECT_EQ(shownText("\xC2\x9B"
                      "2J"),
            "\\xc2\\x9b2J");                                              // CSI in one character
  EXPECT_EQ(shownText("\xE2\x80\xAEgpj.exe"), "\\xe2\\x80\\xaegpj.exe");  // right to left
  EXPECT_EQ(shownText("a\xE2\x80\xA8"
                      "b"),
            "a\\xe2\\x80\\xa8"
            "b");
}

TEST(ShownText, SpellsOutWhatIsNoUtf8) {
  for (const auto& [text, shown] : std::initializer_list<std::pair<const char*, const char*>>{
           {"\xE9.jpg", "\\xe9.jpg"},
           {"\xC3", "\\xc3"},
           {"\xC0\xAF", "\\xc0\\xaf"},
           {"\xED\xA0\x80", "\\xed\\xa0\\x80"},
           {"\xF4\x90\x80\x80", "\\xf4\\x90\\x80\\x80"},
           {"\xE2\x82", "\\xe2\\x82"}}) {
    EXPECT_EQ(shownText(text), shown);
    EXPECT_FALSE(isUtf8(text));
    EXPECT_TRUE(isUtf8(shownText(text)));
  }
  EXPECT_TRUE(isUtf8("\xC3\xA9"));
}

TEST(ShownName, SaysStandardInput) {
  EXPECT_EQ(shownName("-"), "standard input");
  EXPECT_EQ(shownName("a\n"), "a\\n");
}

}  // namespace
}  // namespace pelorin::cli
