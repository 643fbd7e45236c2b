#include "image_processing/filters/row_filter.h"

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

#include "tests/filters/filtered_by_rows.h"
#include "tests/support/faces.h"
#include "tests/support/pictures.h"
#include "tests/support/slow_build.h"

namespace pelorin::image_processing {
namespace {

using test_support::noisePicture;
using test_support::photoLikePicture;
using test_support::slowBuild;
using test_support::withFaces;

const FilterDescription& filterNamed(const std::string& name) {
  return *DefaultFilterFactory::filterFactory()->find(name);
}

std::vector<RowWork> waysToWork() {
  std::vector<RowWork> ways;
  for (const std::uint32_t bandHeight : {1u, 16u, 64u}) ways.push_back({.bandHeight = bandHeight});
  if (slowBuild) ways.erase(ways.begin() + 1, ways.end());
  for (const auto& [bandHeight, count] : {std::pair{64u, 2u}, {1u, 3u}, {16u, 1u}, {16u, 8u}}) {
    ways.push_back({.bandHeight = bandHeight, .workers = &threads(count)});
    if (slowBuild) break;
  }
  return ways;
}

testing::AssertionResult rowsGiveThePicture(const FilterDescription& filter,
                                            const Image<RGBA8Pixel>& picture,
                                            const RowRequest& request) {
  const Image<RGBA8Pixel> expected = byPicture(filter, picture, request);
  for (const RowWork& work : waysToWork()) {
    for (const bool decoded : {false, true}) {
      const Image<RGBA8Pixel> actual = decoded
                                           ? byRows<DecodedRows>(filter, picture, request, work)
                                           : byRows<PictureSource>(filter, picture, request, work);
      if (std::memcmp(actual.data.get(), expected.data.get(), expected.byteSize()) == 0) continue;
      return testing::AssertionFailure()
             << filter.name << " " << request.params << ", " << picture.width << " x "
             << picture.height << ", bands of " << work.bandHeight << ", " << tasksFor(work.workers)
             << " threads";
    }
  }
  const Image<RGBA8Pixel> shared = byPicture(filter, picture, request, &threads(3));
  if (std::memcmp(shared.data.get(), expected.data.get(), expected.byteSize()) == 0)
    return testing::AssertionSuccess();
  return testing::AssertionFailure()
         << filter.name << " " << request.params << ", " << picture.width << " x " << picture.height
         << ", a session with workers";
}

std::vector<std::pair<std::uint32_t, std::uint32_t>> sizes() {
  if (slowBuild) return {{1, 1}, {40, 3}, {3, 70}, {61, 47}};
  return {{1, 1},  {2, 1},  {1, 2}, {300, 1}, {1, 300},
          {40, 3}, {3, 70}, {7, 9}, {61, 47}, {130, 200}};
}

TEST(RowFilter, GivesTheBytesOfWholePictures) {
  const auto factory = DefaultFilterFactory::filterFactory();
  for (const auto& [name, filter] : factory->descriptions) {
    for (const auto& [width, height] : sizes()) {
      RowRequest request{width, height};
      request.params = "slider=0.7;";
      EXPECT_TRUE(rowsGiveThePicture(*filter, photoLikePicture(width, height, 3), request));
      EXPECT_TRUE(rowsGiveThePicture(*filter, noisePicture(width, height, 4), request));
    }
  }
}

TEST(RowFilter, KnowsTheParametersOfEveryFilter) {
  const Image<RGBA8Pixel> picture = photoLikePicture(90, 60, 1);
  const RowRequest request{90, 60};
  const auto check = [&](const char* name, const char* params) {
    RowRequest asked = request;
    asked.params = params;
    EXPECT_TRUE(rowsGiveThePicture(filterNamed(name), picture, asked));
  };
  check("AE0", "slider=0;");
  check("AE0", "slider=-0.5");  // vibrance below 1, by the definition
  check("AE0", "slider=1;gtmOnly=true;");
  check("AE0", "slider=1;gtmOnly=true;gtmExtraMemory=true;");
  check("ZebraBW", "maskRadius=0;");  // no step of the vignette is finite
  check("SummerRGB", "applyMask=0;");
  check("FallRGB", "maskAlpha=7;r=0,nan,1,;");
  check("LowDimRGBCurve", "s1=0.9;s4=0.1;applyMask=1;");
}

TEST(RowFilter, BlendsAndCountsFacesRowByRow) {
  for (const auto& [width, height] : sizes()) {
    const auto w = static_cast<std::int32_t>(width), h = static_cast<std::int32_t>(height);
    RowRequest request{width, height};
    request.params = "slider=0.8;";
    request.metadata = withFaces({{.left = w / 4, .right = w / 2, .bottom = h / 2, .top = h / 4},
                                  {.left = -9, .right = w + 9, .bottom = h + 20, .top = -5},
                                  {.left = 5, .right = 2, .bottom = 3, .top = 9}});
    for (const char* name : {"AE0", "AE08bit"}) {
      EXPECT_TRUE(
          rowsGiveThePicture(filterNamed(name), photoLikePicture(width, height, 6), request));
    }
  }
}

TEST(RowFilter, GivesTheBytesOfWholePicturesForAnyConfiguration) {
  const Image<RGBA8Pixel> picture = photoLikePicture(50, 41, 2);
  RowRequest request{50, 41};
  request.params = "slider=0.6;";
  const auto check = [&](auto change) {
    RowRequest changed = request;
    change(changed.config);
    for (const char* name : {"AE0", "AE08bit"}) {
      EXPECT_TRUE(rowsGiveThePicture(filterNamed(name), picture, changed));
    }
  };
  for (const int radius : {-1, 0, 1, 15, 16, 17, 40, 41, 42, 90}) {
    check([=](FilterConfig& config) { config.ltmMaskRadius = radius; });
  }
  check([](FilterConfig& config) { config.ltmMaskAmount = 0.0f; });
  check([](FilterConfig& config) { config.detailGainHigh = 0.0f; });
  check([](FilterConfig& config) { config.useBilateralGrid = 0; });
  check([](FilterConfig& config) { config.bilateralSpatialFraction = 0.4f; });
}

TEST(RowFilter, TakesAnEmptyPicture) {
  for (const auto& [name, filter] : DefaultFilterFactory::filterFactory()->descriptions) {
    for (const auto& [width, height] : {std::pair{0u, 0u}, {0u, 5u}, {5u, 0u}}) {
      RowRequest request{width, height};
      request.params = "slider=0.4;";
      EXPECT_TRUE(rowsGiveThePicture(*filter, Image<RGBA8Pixel>(width, height), request));
    }
  }
}

// Source and sink count the rows, so that rows of too few or too many bands would be seen.
TEST(RowFilter, GivesUpBetweenBands) {
  const Image<RGBA8Pixel> picture = photoLikePicture(30, 100, 1);
  for (const auto& [name, filter] : DefaultFilterFactory::filterFactory()->descriptions) {
    RowRequest request{30, 100};
    request.params = "slider=0.4;";
    int asked = 0;
    const RowWork work{.bandHeight = 10, .stop = [&] { return ++asked == 4; }};
    const std::unique_ptr<RowFilter> rows = filter->makeRowFilter(request);
    PictureSource source(picture);
    Image<RGBA8Pixel> output(30, 100);
    PictureSink sink(output);
    EXPECT_FALSE(rows->looksFirst() ? rows->look(source, work) : rows->filter(source, sink, work))
        << name;
    EXPECT_EQ(asked, 4) << name;
  }
}

// Of exact masks every row is a piece of work that is asked before, beside the bands that are read.
TEST(RowFilter, GivesUpWithinAFilterOfWholePictures) {
  const Image<RGBA8Pixel> picture = photoLikePicture(30, 50, 1);
  RowRequest request{30, 50};
  request.params = "slider=0.4;";
  request.config.useBilateralGrid = 0;
  const auto filters = [&](int mostAsked, int& asked) {
    const RowWork work{.bandHeight = 10, .stop = [&] { return ++asked > mostAsked; }};
    const std::unique_ptr<RowFilter> rows = filterNamed("AE0").makeRowFilter(request);
    PictureSource source(picture);
    Image<RGBA8Pixel> output(30, 50);
    PictureSink sink(output);
    return rows->filter(source, sink, work);
  };
  int all = 0;
  EXPECT_TRUE(filters(1000, all));
  EXPECT_GE(all, 5 + 50 + 5);
  for (int most = 0; most < all; most += 7) {
    int asked = 0;
    EXPECT_FALSE(filters(most, asked));
    EXPECT_EQ(asked, most + 1);
  }
}

TEST(RowFilter, LetsErrorsOfTheSourceThrough) {
  struct Damaged : RowSource {
    const RGBA8Pixel* next(std::uint32_t, RGBA8Pixel*) override {
      throw std::runtime_error("damaged");
    }
  } damaged;
  RowRequest request{20, 20};
  request.params = "slider=0.4;";
  const std::unique_ptr<RowFilter> rows = filterNamed("AE0").makeRowFilter(request);
  EXPECT_THROW(rows->look(damaged, {}), std::runtime_error);
}

TEST(RowFilter, AsksForItsParametersBeforeTheFirstRow) {
  EXPECT_THROW(filterNamed("AE0").makeRowFilter({20, 20}), std::out_of_range);
}

}  // namespace
}  // namespace pelorin::image_processing
