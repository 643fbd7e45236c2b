#include "photo/filter_photo.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "tests/photo/metadata/phone_photos.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::photo {
namespace {

using namespace image_processing;
using test_support::Bytes;
using test_support::JpegRecipe;
using test_support::makeJpeg;
using test_support::phonePhoto;
using test_support::photoLikePicture;

/// Decoded as a whole, filtered in a session, and saved.
Bytes byPicture(const Bytes& file, const FilterRequest& request, const Format& format) {
  Photo photo = open(file, request.open);
  FilteredImage session(photo.image,
                        metadataWithFaces(allFaces(request.faces, photo), photo.image->width,
                                          photo.image->height, request.open.scale),
                        "", defaultFilterConfigValue, DefaultFilterFactory::filterFactory());
  Image<RGBA8Pixel> output(photo.image->width, photo.image->height);
  session.applyFilterWithParams(request.filter, request.params, defaultFilterConfigValue, output);
  return save(output, format, photo.metadata, request.save);
}

void expectSameFiles(const Bytes& file, const std::string& what) {
  FilterRequest request{.filter = "", .params = "slider=0.7;"};
  request.faces = {{0.2f, 0.2f, 0.7f, 0.6f}};
  for (const std::string filter : {"AE0", "AE08bit", "WinterRGB", "PassThrough"}) {
    for (const int scale : {1, 2}) {
      request.filter = filter;
      request.open.scale = scale;
      for (const Format& format : formats()) {
        const Bytes expected = byPicture(file, request, format);
        for (const std::uint64_t pixels : {std::uint64_t{0}, std::uint64_t{1} << 30}) {
          const FilteredPhoto filtered =
              filterPhoto(file, filter, request.params, request.faces, request.open, request.save,
                          &format, {.pixels = pixels});
          EXPECT_EQ(filtered.file, expected)
              << what << ", " << filter << " at 1/" << scale << " to " << format.name << ", "
              << pixels << " bytes kept";
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
  const FilteredPhoto filtered =
      filterPhoto(png, "SummerRGB", "", {}, {.rotate = 90}, {}, formatNamed("JPEG"));
  EXPECT_EQ(filtered.size, (PictureSize{29, 41}));
  EXPECT_EQ(filtered.facts.format, "PNG");
  ASSERT_EQ(filtered.lost.size(), 1u);
  EXPECT_EQ(filtered.lost[0].what, "transparency");
}

TEST(FilterPhoto, HasNoFileOfADamagedPhoto) {
  Bytes file = makeJpeg(JpegRecipe{.width = 200, .height = 150});
  file.resize(file.size() * 2 / 3);
  for (const char* filter : {"AE0", "WinterRGB"}) {
    for (const std::uint64_t pixels : {std::uint64_t{0}, std::uint64_t{1} << 30}) {
      EXPECT_THROW(
          filterPhoto(file, filter, "slider=0.4;", {}, {}, {}, nullptr, {.pixels = pixels}),
          PhotoError);
    }
  }
}

TEST(FilterPhoto, StopsWhenItIsAskedTo) {
  std::stop_source stop;
  stop.request_stop();
  EXPECT_THROW(filterPhoto(makeJpeg(JpegRecipe{}), "AE0", "slider=0.4;", {},
                           {.stop = stop.get_token()}, {}, nullptr),
               Stopped);
}

}  // namespace
}  // namespace pelorin::photo
