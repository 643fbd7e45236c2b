#include "cli/pictures/text.h"

#include <gtest/gtest.h>

#include <string>

namespace pelorin::cli {
namespace {

constexpr TextStyle style{14};

int darkPixels(const Canvas& canvas) {
  const auto picture = canvas.picture();
  int count = 0;
  for (std::size_t i = 0; i < picture.pixelCount(); ++i) count += picture.data.get()[i].g < 128;
  return count;
}

TEST(Printable, KeepsTextOfAnyLanguage) {
  const std::string text = "f\xC3\xBCr \xE2\x82\xAC \xF0\x9F\x98\x80.jpg";
  EXPECT_EQ(printable(text), text);
  EXPECT_EQ(printable(""), "");
}

TEST(Printable, ReplacesEachByteThatIsNotUtf8) {
  const std::string mark = "\xEF\xBF\xBD";
  EXPECT_EQ(printable("a\xFF.jpg"), "a" + mark + ".jpg");
  EXPECT_EQ(printable("\xC3"), mark);                                   // cut short
  EXPECT_EQ(printable("\xC0\xAF"), mark + mark);                        // overlong
  EXPECT_EQ(printable("\xED\xA0\x80"), mark + mark + mark);             // a surrogate
  EXPECT_EQ(printable("\xF4\x90\x80\x80"), mark + mark + mark + mark);  // above the last one
  EXPECT_EQ(printable("\xE2\x82z"), mark + mark + "z");
}

TEST(Printable, ReplacesControlCharacters) {
  EXPECT_EQ(printable("a\nb\x7F"),
            "a\xEF\xBF\xBD"
            "b\xEF\xBF\xBD");
  EXPECT_EQ(printable(std::string_view("\0", 1)), "\xEF\xBF\xBD");
}

TEST(DrawText, LeavesInkEvenAfterTextThatIsNotUtf8) {
  const Canvas canvas(200, 40);
  drawText(canvas.context(), "\xFF\xFE", 100, 20, style);
  const int before = darkPixels(canvas);
  drawText(canvas.context(), "Hello", 10, 20, style);
  EXPECT_GT(darkPixels(canvas), before + 20);
}

TEST(DrawText, StandsOnTheSideItIsAlignedTo) {
  for (const Align align : {Align::left, Align::centre, Align::right}) {
    const Canvas canvas(300, 40);
    drawText(canvas.context(), "Hello", 150, 25, style, align);
    const auto picture = canvas.picture();
    bool inkLeft = false, inkRight = false;
    for (std::uint32_t y = 0; y < 40; ++y) {
      for (std::uint32_t x = 0; x < 300; ++x) {
        if (picture.row(y)[x].g < 128) (x < 150 ? inkLeft : inkRight) = true;
      }
    }
    EXPECT_EQ(inkLeft, align != Align::left);
    EXPECT_EQ(inkRight, align != Align::right);
  }
}

TEST(ShortenedToWidth, KeepsTextThatFits) {
  const Canvas canvas(10, 10);
  EXPECT_EQ(shortenedToWidth(canvas.context(), "a.jpg", style, 200), "a.jpg");
  EXPECT_EQ(shortenedToWidth(canvas.context(), "", style, 0), "");
}

TEST(ShortenedToWidth, CutsTheMiddleAndFits) {
  const Canvas canvas(10, 10);
  const std::string name = std::string(200, 'a') + "\xC3\xBC" + std::string(200, 'b') + ".jpg";
  for (const double width : {40.0, 100.0, 300.0, 1000.0}) {
    const std::string cut = shortenedToWidth(canvas.context(), name, style, width);
    EXPECT_LE(textWidth(canvas.context(), cut, style), width);
    EXPECT_EQ(cut.front(), 'a');
    EXPECT_EQ(cut.back(), 'g');
    EXPECT_NE(cut.find("\xE2\x80\xA6"), std::string::npos);
    EXPECT_EQ(printable(cut), cut) << "a character was cut in two";
  }
}

TEST(ShortenedToWidth, LeavesTheEllipsisWhereNothingFits) {
  const Canvas canvas(10, 10);
  EXPECT_EQ(shortenedToWidth(canvas.context(), "name", style, 0), "\xE2\x80\xA6");
}

}  // namespace
}  // namespace pelorin::cli
