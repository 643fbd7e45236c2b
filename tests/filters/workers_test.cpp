#include "image_processing/core/workers.h"

#include <gtest/gtest.h>

#include <cstring>
#include <stdexcept>
#include <thread>
#include <vector>

#include "tests/filters/filtered_by_rows.h"
#include "tests/support/faces.h"
#include "tests/support/pictures.h"

// What workers make of a picture is compared by the tests of row filters; these are for the thread
// sanitizer to watch.
namespace pelorin::image_processing {
namespace {

using test_support::photoLikePicture;
using test_support::withFaces;

bool areSame(const Image<RGBA8Pixel>& a, const Image<RGBA8Pixel>& b) {
  return std::memcmp(a.data.get(), b.data.get(), b.byteSize()) == 0;
}

RowRequest requestWithFaces(std::uint32_t width, std::uint32_t height) {
  RowRequest request{width, height};
  request.params = "slider=0.7;";
  request.metadata = withFaces({{.left = 10, .right = 60, .bottom = 70, .top = 20},
                                {.left = 30, .right = 90, .bottom = 40, .top = 5}});
  return request;
}

TEST(Workers, ShareEveryFilter) {
  const Image<RGBA8Pixel> picture = photoLikePicture(120, 150, 3);
  const RowRequest request = requestWithFaces(120, 150);
  const RowWork work{.bandHeight = 32, .workers = &threads(3)};
  for (const auto& [name, filter] : DefaultFilterFactory::filterFactory()->descriptions) {
    const Image<RGBA8Pixel> expected = byPicture(*filter, picture, request);
    EXPECT_TRUE(areSame(byPicture(*filter, picture, request, work.workers), expected)) << name;
    EXPECT_TRUE(areSame(byRows<DecodedRows>(*filter, picture, request, work), expected)) << name;
    EXPECT_TRUE(areSame(byRows<PictureSource>(*filter, picture, request, work), expected)) << name;
  }
}

TEST(Workers, ServeSeveralThreadsOfOneSession) {
  auto photo = std::make_shared<Image<RGBA8Pixel>>(photoLikePicture(160, 120, 5));
  const RowRequest request = requestWithFaces(160, 120);
  const auto filter = DefaultFilterFactory::filterFactory()->find("AE0");
  const Image<RGBA8Pixel> expected = byPicture(*filter, *photo, request);
  FilteredImage session(photo, request.metadata, "", request.config,
                        DefaultFilterFactory::filterFactory(), &threads(3));
  std::vector<Image<RGBA8Pixel>> outputs;
  for (int i = 0; i < 3; ++i) outputs.emplace_back(160, 120);
  std::vector<std::thread> callers;
  for (Image<RGBA8Pixel>& output : outputs) {
    callers.emplace_back(
        [&] { session.applyFilterWithParams("AE0", request.params, request.config, output); });
  }
  for (std::thread& caller : callers) caller.join();
  for (const Image<RGBA8Pixel>& output : outputs) EXPECT_TRUE(areSame(output, expected));
}

TEST(Workers, BringErrorsOfTheSourceAndTheSinkBack) {
  struct Damaged : RowSource {
    const RGBA8Pixel* next(std::uint32_t, RGBA8Pixel* room) override {
      if (++bands == 3) throw std::runtime_error("damaged");
      return room;
    }
    int bands = 0;
  };
  struct Full : RowSink {
    void write(const RGBA8Pixel*, std::uint32_t) override { throw std::runtime_error("full"); }
  };
  const RowWork work{.workers = &threads(3)};
  const Image<RGBA8Pixel> picture = photoLikePicture(30, 90, 1);
  RowRequest request{30, 90};
  request.params = "slider=0.4;";
  for (const char* name : {"AE0", "WinterRGB"}) {
    const auto filter = DefaultFilterFactory::filterFactory()->find(name)->makeRowFilter(request);
    Damaged damaged;
    PictureSource source(picture);
    Full full;
    if (filter->looksFirst()) {
      PictureSource seen(picture);
      ASSERT_TRUE(filter->look(seen, work));
    }
    Image<RGBA8Pixel> output(30, 90);
    PictureSink sink(output);
    EXPECT_THROW(filter->filter(damaged, sink, work), std::runtime_error);
    EXPECT_THROW(filter->filter(source, full, work), std::runtime_error);
  }
}

}  // namespace
}  // namespace pelorin::image_processing
