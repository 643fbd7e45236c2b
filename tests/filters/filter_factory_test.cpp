#include "image_processing/filters/filter_factory.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <thread>
#include <vector>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/pass_through.h"
#include "tests/support/filter_state.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::noisePicture;
using test_support::stateOf;

TEST(FilterFactory, FindsExactNamesOnly) {
  const auto factory = DefaultFilterFactory::filterFactory();
  EXPECT_NE(factory->find("PassThrough"), nullptr);
  EXPECT_EQ(factory->find("Original"), nullptr);  // a display name
  EXPECT_EQ(factory->find("passthrough"), nullptr);
  EXPECT_EQ(factory->find("PassThrough "), nullptr);
  EXPECT_EQ(factory->find(""), nullptr);
}

TEST(FilterFactory, GivesTheLaterOfTwoDescriptionsWithOneName) {
  ConcreteDescription<PassThrough> first("A", "first", ""), second("A", "second", "");
  FilterFactory factory;
  factory.addFilterDescription(&first);
  factory.addFilterDescription(&second);
  EXPECT_EQ(factory.find("A"), &second);
  EXPECT_EQ(factory.descriptions.size(), 1u);
}

TEST(DefaultFilterFactory, ShowsBothAutoEnhanceFiltersAsAuto) {
  const auto factory = DefaultFilterFactory::filterFactory();
  ASSERT_NE(factory->find("AE0"), nullptr);
  ASSERT_NE(factory->find("AE08bit"), nullptr);
  EXPECT_EQ(factory->find("AE0")->displayName, "Auto");
  EXPECT_EQ(factory->find("AE08bit")->displayName, "Auto");
  EXPECT_EQ(factory->find("AE0")->description,
            "Original auto-enhance. Parameters: \"slider=0.4;\" sets slider to 0.4");
  EXPECT_EQ(factory->find("AE08bit")->description, "Auto-enhance with 8-bit masks.");
}

TEST(DefaultFilterFactory, DescribesPassThrough) {
  const FilterDescription* description = DefaultFilterFactory::filterFactory()->find("PassThrough");
  ASSERT_NE(description, nullptr);
  EXPECT_EQ(description->name, "PassThrough");
  EXPECT_EQ(description->displayName, "Original");
  EXPECT_EQ(description->description, "Pass through filter, no changes are made to the image");
}

TEST(DefaultFilterFactory, IsOneForTheProcessFromAnyThread) {
  std::vector<std::shared_ptr<FilterFactory>> seen(8);
  std::vector<std::thread> threads;
  for (auto& factory : seen) {
    threads.emplace_back([&factory] { factory = DefaultFilterFactory::filterFactory(); });
  }
  for (std::thread& thread : threads) thread.join();
  for (const auto& factory : seen) EXPECT_EQ(factory, seen[0]);
}

TEST(PassThrough, CopiesASourceOfTheSameSize) {
  const auto source = noisePicture(13, 7, 1);
  Image<RGBA8Pixel> output(13, 7);
  PassThrough filter(stateOf(source));
  filter.init("anything=1;");
  filter.applyConfig("", defaultFilterConfigValue, output);
  EXPECT_EQ(std::memcmp(output.data.get(), source.data.get(), source.byteSize()), 0);
}

TEST(PassThrough, CopiesOnlyAsManyBytesAsASmallerOutputHolds) {
  const auto source = noisePicture(13, 7, 2);
  std::vector<RGBA8Pixel> bytes(21, RGBA8Pixel{1, 2, 3, 4});
  Image<RGBA8Pixel> output(5, 4, {bytes.data(), [](RGBA8Pixel*) {}});
  PassThrough filter(stateOf(source));
  filter.applyConfig("", defaultFilterConfigValue, output);
  EXPECT_TRUE(std::equal(bytes.begin(), bytes.begin() + 20, source.data.get()));
  EXPECT_EQ(bytes[20], (RGBA8Pixel{1, 2, 3, 4}));
}

TEST(PassThrough, LeavesTheRestOfALargerOutput) {
  const auto source = noisePicture(2, 2, 3);
  Image<RGBA8Pixel> output = test_support::flatPicture(3, 2, {9, 9, 9, 9});
  PassThrough filter(stateOf(source));
  filter.applyConfig("", defaultFilterConfigValue, output);
  EXPECT_TRUE(std::equal(source.data.get(), source.data.get() + 4, output.data.get()));
  EXPECT_EQ(output.data.get()[4], (RGBA8Pixel{9, 9, 9, 9}));
}

}  // namespace
}  // namespace pelorin::image_processing
