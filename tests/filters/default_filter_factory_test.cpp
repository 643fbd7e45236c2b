#include "image_processing/filters/default_filter_factory.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <optional>
#include <string>
#include <vector>

#include "image_processing/filters/filtered_image.h"
#include "tests/support/comma_locale.h"
#include "tests/support/fingerprint.h"
#include "tests/support/looks.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

struct Row {
  const char *name, *displayName, *description;
};

constexpr Row lookRows[] = {
    {"ZebraBW", "Snow", "Black-and-white filter with softlight radial vignette."},
    {"SummerRGB", "Summer", "A light filter with hints of raspberry."},
    {"SpringRGB", "Spring", "Warm filter with radial vignette."},
    {"FallRGB", "Fall", "A bright and energetic filter."},
    {"VintageRGB", "Vintage", "Filter that gives a 'vintage' effect."},
    {"WinterRGB", "Winter", "Cool filter with softlight radial vignette."},
    {"LowDimRGBCurve", "StarFish",
     "RGB Curve filter with four parameters, s1, s2, s3, and s4. Each should be in range [0,1]. "
     "Set all to 0.5 for the filter that makes minimal changes."},
};

TEST(DefaultFilterFactory, DescribesEveryLook) {
  const auto factory = DefaultFilterFactory::filterFactory();
  for (const Row& row : lookRows) {
    const FilterDescription* description = factory->find(row.name);
    ASSERT_NE(description, nullptr) << row.name;
    EXPECT_EQ(description->name, row.name);
    EXPECT_EQ(description->displayName, row.displayName);
    EXPECT_EQ(description->description, row.description);
  }
}

TEST(DefaultFilterFactory, MakesEveryLook) {
  const Image<RGBA8Pixel> picture = test_support::photoLikePicture(20, 10, 1);
  for (const Row& row : lookRows) {
    auto state = test_support::stateOf(picture);
    const auto filter = DefaultFilterFactory::filterFactory()->find(row.name)->makeFilter(state);
    filter->init("");
    const Image<RGBA8Pixel> output = test_support::applied(*filter, 20, 10, "");
    EXPECT_EQ(output.row(9)[19].a, picture.row(9)[19].a) << row.name;
  }
}

TEST(DefaultFilterFactory, MakesFiltersThatGiveTheSameBytesInThePlaceOfTheirSource) {
  for (const auto& [name, description] : DefaultFilterFactory::filterFactory()->descriptions) {
    // Small enough for the plain code, and large enough for tables and every tail.
    for (const auto& [width, height] : {std::pair{1u, 1u}, {7u, 5u}, {61u, 43u}, {407u, 397u}}) {
      const auto picture = [w = width, h = height] {
        return std::make_shared<Image<RGBA8Pixel>>(test_support::photoLikePicture(w, h, 3));
      };
      const auto apply = [&, name = name](std::shared_ptr<Image<RGBA8Pixel>> source,
                                          Image<RGBA8Pixel> output) {
        FilteredImage session(source, {}, "", defaultFilterConfigValue,
                              DefaultFilterFactory::filterFactory());
        session.applyFilterWithParams(name, "slider=0.7;", defaultFilterConfigValue, output);
        return test_support::fingerprint(output);
      };
      const auto inPlace = picture();
      EXPECT_EQ(apply(inPlace, *inPlace), apply(picture(), Image<RGBA8Pixel>(width, height)))
          << name << " of " << width << " x " << height;
    }
  }
}

TEST(DefaultFilterFactory, MakesFiltersThatReadTheSameNumbersUnderADecimalComma) {
  const std::string params =
      "slider=0.7;s1=0.25;s3=0.75;applyMask=0.5;maskRadius=1.5;maskAlpha=0.625;r=0,0.25,1,;";
  const auto fingerprints = [&params](bool comma) {
    std::optional<test_support::CommaLocale> locale;
    if (comma) locale.emplace();
    std::vector<std::string> outputs;
    for (const auto& [name, description] : DefaultFilterFactory::filterFactory()->descriptions) {
      auto photo = std::make_shared<Image<RGBA8Pixel>>(test_support::photoLikePicture(30, 20, 5));
      FilteredImage session(photo, {}, "", defaultFilterConfigValue,
                            DefaultFilterFactory::filterFactory());
      Image<RGBA8Pixel> output(30, 20);
      session.applyFilterWithParams(name, params, defaultFilterConfigValue, output);
      outputs.push_back(name + " " + test_support::fingerprint(output));
    }
    return outputs;
  };
  EXPECT_EQ(fingerprints(true), fingerprints(false));
}

TEST(DefaultFilterFactory, HoldsExactlyTenFilters) {
  std::vector<std::string> names = {"AE08bit", "AE0", "PassThrough"};
  for (const Row& row : lookRows) names.push_back(row.name);
  std::vector<std::string> held;
  for (const auto& [name, description] : DefaultFilterFactory::filterFactory()->descriptions) {
    EXPECT_EQ(description->name, name);
    held.push_back(name);
  }
  EXPECT_EQ(held.size(), 10u);
  EXPECT_THAT(held, testing::UnorderedElementsAreArray(names));
}

TEST(DefaultFilterFactory, DoesNotFindALookByItsDisplayName) {
  for (const Row& row : lookRows) {
    EXPECT_EQ(DefaultFilterFactory::filterFactory()->find(row.displayName), nullptr);
  }
}

}  // namespace
}  // namespace pelorin::image_processing
