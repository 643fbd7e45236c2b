#include "photo/filter_photo.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "tests/photo/filtered_by_picture.h"
#include "tests/photo/metadata/phone_photos.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::photo {
namespace {

using namespace image_processing;
using test_support::byPicture;
using test_support::Bytes;
using test_support::JpegRecipe;
using test_support::makeJpeg;
using test_support::phonePhoto;
using test_support::photoLikePicture;
using test_support::threads;

std::string parametersOf(const std::string& filter) {
  return filter.starts_with("AE") ? "slider=0.7;" : "";
}

std::vector<RowResources> ways() {
  constexpr std::uint64_t all = std::uint64_t{1} << 30;
  return {{.pixels = 0},
          {.pixels = all},
          {.pixels = 0, .workers = &threads(2)},
          {.pixels = all, .workers = &threads(3)}};
}

void expectSameFiles(const Bytes& file, const std::string& what) {
  FilterRequest request;
  request.faces = {{0.2f, 0.2f, 0.7f, 0.6f}};
  for (const std::string filter : {"AE0", "AE08bit", "WinterRGB", "PassThrough"}) {
    for (const int scale : {1, 2}) {
      request.filter = filter;
      request.params = parametersOf(filter);
      request.open.scale = scale;
      for (const Format& format : formats()) {
        const Bytes expected = byPicture(file, request, &format);
        for (const RowResources& resources : ways()) {
          EXPECT_EQ(filterPhoto(file, request, &format, resources).file, expected)
              << what << ", " << filter << " at 1/" << scale << " to " << format.name << ", "
              << resources.pixels << " bytes kept, " << tasksFor(resources.workers) << " threads";
        }
      }
    }
  }
}

TEST(FilterPhoto, GivesTheFileOfTheWholePictureWhetherItsPixelsAreKeptOrNot) {
  for (const int orientation : {1, 2, 6}) {
    expectSameFiles(phonePhoto(orientation, {}), std::to_string(orientation));
  }
  expectSameFiles(makeJpeg(JpegRecipe{.scans = test_support::completeProgressiveScans()}),
                  "progressive");
  expectSameFiles(makeJpeg(JpegRecipe{.samples = JCS_GRAYSCALE, .stored = JCS_GRAYSCALE}), "grey");
  expectSameFiles(makeJpeg(JpegRecipe{.samples = JCS_CMYK, .stored = JCS_CMYK}), "CMYK");
  expectSameFiles(save(photoLikePicture(41, 29, 1), "PNG"), "transparent PNG");
  expectSameFiles(makeJpeg(JpegRecipe{.width = 1, .height = 1}), "one pixel");
}

TEST(FilterPhoto, TellsSizeFactsAndLosses) {
  const Bytes png = save(photoLikePicture(41, 29, 1), "PNG");
  const FilteredPhoto filtered = filterPhoto(
      png, {.filter = "SummerRGB", .params = "", .open = {.rotate = 90}}, formatNamed("JPEG"));
  EXPECT_EQ(filtered.size, (PictureSize{29, 41}));
  EXPECT_EQ(filtered.facts.format, "PNG");
  ASSERT_EQ(filtered.lost.size(), 1u);
  EXPECT_EQ(filtered.lost[0].what, "transparency");
}

TEST(FilterPhoto, HasNoFileOfADamagedPhoto) {
  Bytes file = makeJpeg(JpegRecipe{.width = 200, .height = 150});
  file.resize(file.size() * 2 / 3);
  for (const char* filter : {"AE0", "WinterRGB"}) {
    const FilterRequest request{.filter = filter, .params = parametersOf(filter)};
    for (const RowResources& resources : ways())
      EXPECT_THROW(filterPhoto(file, request, nullptr, resources), PhotoError);
  }
}

TEST(FilterPhoto, StopsWhenItIsAskedTo) {
  std::stop_source stop;
  stop.request_stop();
  const FilterRequest request{
      .filter = "AE0", .params = "slider=0.4;", .open = {.stop = stop.get_token()}};
  EXPECT_THROW(filterPhoto(makeJpeg(JpegRecipe{}), request), Stopped);
}

}  // namespace
}  // namespace pelorin::photo
