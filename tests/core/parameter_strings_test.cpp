#include "image_processing/core/parameter_strings.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <boost/lexical_cast.hpp>
#include <cmath>
#include <sstream>
#include <stdexcept>
#include <string>

#include "tests/support/comma_locale.h"

namespace pelorin::image_processing {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

TEST(SplitStringAt, LeavesOutWhatFollowsTheLastSeparator) {
  EXPECT_THAT(splitStringAt("a;b;c", ";"), ElementsAre("a", "b"));
  EXPECT_THAT(splitStringAt("a;b;", ";"), ElementsAre("a", "b"));
  EXPECT_THAT(splitStringAt("abc", ";"), IsEmpty());
  EXPECT_THAT(splitStringAt("", ";"), IsEmpty());
}

TEST(SplitStringAt, KeepsEmptyPieces) {
  EXPECT_THAT(splitStringAt(";;", ";"), ElementsAre("", ""));
  EXPECT_THAT(splitStringAt("a;;b;", ";"), ElementsAre("a", "", "b"));
}

TEST(SplitStringAt, TakesASeparatorOfSeveralCharacters) {
  EXPECT_THAT(splitStringAt("a--b--c", "--"), ElementsAre("a", "b"));
}

TEST(SplitStringOnceAt, AlwaysGivesTwoStrings) {
  EXPECT_THAT(splitStringOnceAt("s1=0.3", "="), ElementsAre("s1", "0.3"));
  EXPECT_THAT(splitStringOnceAt("s1", "="), ElementsAre("s1", ""));
  EXPECT_THAT(splitStringOnceAt("s1=", "="), ElementsAre("s1", ""));
  EXPECT_THAT(splitStringOnceAt("a=b=c", "="), ElementsAre("a", "b=c"));
  EXPECT_THAT(splitStringOnceAt("", "="), ElementsAre("", ""));
}

TEST(ReadNumber, TakesTheLongestNumberAtTheStart) {
  EXPECT_EQ(readNumber("0.4abc"), 0.4);
  EXPECT_EQ(readNumber(" \t-2e1"), -20.0);
  EXPECT_EQ(readNumber("abc"), 0.0);
  EXPECT_EQ(readNumber(""), 0.0);
  EXPECT_TRUE(std::isnan(readNumber("nan")));
  EXPECT_TRUE(std::isinf(readNumber("1e999")));
}

TEST(ParameterStrings, ReadTheSameUnderALocaleWithADecimalComma) {
  const test_support::CommaLocale comma;
  std::ostringstream written;
  written << std::boolalpha << 1234.5 << true;
  ASSERT_EQ(written.str(), "1.234,5wahr");  // the locale is at work

  EXPECT_EQ(readNumber("0.25"), 0.25);
  EXPECT_EQ(readNumber("1.234,5"), 1.234);
  const FilterParams params("slider=0.25;whole=1234;comma=0,25;groups=1.234,5;on=true;ein=wahr;");
  EXPECT_EQ(params.readFloat("slider"), 0.25f);
  EXPECT_EQ(params.readFloat("whole"), 1234.0f);
  EXPECT_THROW(params.readFloat("comma"), boost::bad_lexical_cast);
  EXPECT_THROW(params.readFloat("groups"), boost::bad_lexical_cast);
  EXPECT_TRUE(params.readBool("on"));
  EXPECT_FALSE(params.readBool("ein"));
  EXPECT_EQ(textOf(true), "true");
}

TEST(FilterParams, HonoursAnItemWithoutATrailingSemicolonUnlikeTheSplitter) {
  EXPECT_EQ(FilterParams("slider=0.4").readFloat("slider"), 0.4f);
  EXPECT_EQ(FilterParams("slider=0.4;").readFloat("slider"), 0.4f);
  EXPECT_THAT(splitStringAt("slider=0.4", ";"), IsEmpty());
}

TEST(FilterParams, TakesTheLastOfSeveralItemsWithOneKey) {
  EXPECT_EQ(FilterParams("s1=0.2;s1=0.7;").at("s1"), "0.7");
}

TEST(FilterParams, KeepsSpacesInKeys) {
  const FilterParams params(" s1=0.2;");
  EXPECT_EQ(params.at(" s1"), "0.2");
  EXPECT_THROW(params.at("s1"), std::out_of_range);
}

TEST(FilterParams, CutsAnItemAtItsFirstEqualsSign) {
  const FilterParams params("a=b=c;=5;nothing;;x=");
  EXPECT_EQ(params.at("a"), "b=c");
  EXPECT_EQ(params.at(""), "5");
  EXPECT_EQ(params.at("x"), "");
  EXPECT_EQ(params.items().size(), 3u);
}

TEST(FilterParams, OfTheEmptyTextIsEmpty) {
  EXPECT_THAT(FilterParams("").items(), IsEmpty());
  EXPECT_THAT(splitStringAt("", ";"), IsEmpty());
}

TEST(FilterParams, ReadsOnlyTheWordTrueAsTrue) {
  const FilterParams params("a=true;b=1;c=yes;d=True;e=;f=false;g= true;h=tru");
  EXPECT_TRUE(params.readBool("a"));
  EXPECT_TRUE(params.readBool("g"));  // a stream skips leading white space
  for (const char* key : {"b", "c", "d", "e", "f", "h", "absent"}) {
    EXPECT_FALSE(params.readBool(key)) << key;
  }
}

TEST(FilterParams, ReadsABooleanAsAStreamDoesWhateverFollowsTheWord) {
  const FilterParams params("a=truex;b=true x;c=true1;d=falsex;e=xtrue;");
  for (const char* key : {"a", "b", "c"}) EXPECT_TRUE(params.readBool(key)) << key;
  for (const char* key : {"d", "e"}) EXPECT_FALSE(params.readBool(key)) << key;
}

TEST(FilterParams, ReportsAMissingKeyAsMapAt) {
  try {
    FilterParams("slider=0.4;").at("Slider");
    FAIL() << "nothing thrown";
  } catch (const std::out_of_range& error) {
    EXPECT_STREQ(error.what(), "map::at");
  }
}

TEST(FilterParams, ReadsAFloatOnlyAsAWhole) {
  using namespace std::string_literals;
  for (const std::string& text :
       {"0.4abc"s, ""s, " 0.4"s, "\v0.4"s, "0.4 "s, "abc"s, "0,4"s, "0x1"s, "1e"s, "1e+"s, "."s,
        "-"s, "--1"s, "1e39"s, "-1e39"s, "infinit"s, "0.4\0"s, " inf"s}) {
    const FilterParams params("slider=" + text);
    EXPECT_THROW(params.readFloat("slider"), boost::bad_lexical_cast) << text;
  }
  EXPECT_EQ(FilterParams("slider=+.5").readFloat("slider"), 0.5f);
  EXPECT_EQ(FilterParams("slider=5.e0").readFloat("slider"), 5.0f);
  EXPECT_EQ(FilterParams("slider=1e-50").readFloat("slider"), 0.0f);
  EXPECT_EQ(FilterParams("slider=-1.5e-1").readFloat("slider"), -0.15f);
  EXPECT_TRUE(std::isnan(FilterParams("slider=nan").readFloat("slider")));
  EXPECT_TRUE(std::isinf(FilterParams("slider=-inf").readFloat("slider")));
}

TEST(TextOf, WritesBooleansAsWords) {
  EXPECT_EQ(textOf(true), "true");
  EXPECT_EQ(textOf(false), "false");
}

}  // namespace
}  // namespace pelorin::image_processing
