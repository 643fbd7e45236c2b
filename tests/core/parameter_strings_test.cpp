#include "image_processing/core/parameter_strings.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <boost/lexical_cast.hpp>
#include <clocale>
#include <cmath>
#include <stdexcept>

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

TEST(ReadNumber, ReadsAPointWhateverTheLocale) {
  const char* const before = std::setlocale(LC_NUMERIC, nullptr);
  const std::string restored = before;
  if (std::setlocale(LC_NUMERIC, "de_DE.UTF-8") == nullptr) {
    GTEST_SKIP() << "no locale with a decimal comma is installed";
  }
  EXPECT_EQ(readNumber("0.25"), 0.25);
  EXPECT_EQ(FilterParams("slider=0.25").readFloat("slider"), 0.25f);
  std::setlocale(LC_NUMERIC, restored.c_str());
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

TEST(FilterParams, ReportsAMissingKeyAsMapAt) {
  try {
    FilterParams("slider=0.4;").at("Slider");
    FAIL() << "nothing thrown";
  } catch (const std::out_of_range& error) {
    EXPECT_STREQ(error.what(), "map::at");
  }
}

TEST(FilterParams, ReadsAFloatOnlyAsAWhole) {
  for (const std::string text : {"0.4abc", "", " 0.4", "0.4 ", "abc", "0,4"}) {
    const FilterParams params("slider=" + text);
    EXPECT_THROW(params.readFloat("slider"), boost::bad_lexical_cast) << text;
  }
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
