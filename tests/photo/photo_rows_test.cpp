#include "photo/photo_rows.h"

#include <gtest/gtest.h>

#include <string>

#include "photo/photo.h"
#include "tests/photo/metadata/phone_photos.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::photo {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;
using test_support::Bytes;
using test_support::JpegRecipe;
using test_support::makeJpeg;

Image<RGBA8Pixel> readIn(PhotoRows& photo, bool again, std::uint32_t atOnce) {
  const Image<RGBA8Pixel> picture(photo.size().width, photo.size().height);
  image_processing::RowSource& rows = photo.sweep(again);
  for (std::uint32_t y = 0; y < picture.height;) {
    const std::uint32_t count = std::min(picture.height - y, atOnce);
    const RGBA8Pixel* const pixels = rows.next(count, picture.row(y));
    std::copy_n(pixels, std::size_t{picture.width} * count, picture.row(y));
    y += count;
  }
  return picture;
}

TEST(PhotoRows, AreThoseOfTheOpenedPhotoAsOftenAsTheyAreAskedFor) {
  const Bytes files[] = {test_support::phonePhoto(1, {}), test_support::phonePhoto(6, {}),
                         test_support::phonePhoto(2, {}),
                         makeJpeg({.scans = test_support::completeProgressiveScans()})};
  for (const Bytes& file : files) {
    for (const OpenOptions& options : {OpenOptions{}, OpenOptions{.scale = 2, .rotate = 90}}) {
      const Photo whole = open(file, options);
      for (const std::uint64_t kept : {0, 1 << 20}) {
        SparePixels spare;
        for (int photos = 0; photos < 2; ++photos) {  // the second has the spare pixels
          PhotoRows photo(file, options, {.pixels = kept, .spare = &spare});
          EXPECT_EQ(photo.faces().size(), whole.faces.size());
          for (const bool again : {true, true, false})
            EXPECT_EQ(test_support::rawBytes(readIn(photo, again, 7)),
                      test_support::rawBytes(*whole.image));
        }
      }
    }
  }
}

TEST(PhotoRows, TellOfDamageAtTheLastRowAtTheLatest) {
  Bytes file = makeJpeg({.width = 200, .height = 150});
  file.resize(file.size() * 2 / 3);
  for (const std::uint64_t kept : {0, 1 << 20}) {
    PhotoRows photo(file, {}, {.pixels = kept});
    EXPECT_THROW(readIn(photo, true, 16), PhotoError);
  }
}

TEST(PixelBudget, LetsWaitWhoDoesNotFitUntilThatMuchIsFree) {
  PixelBudget budget(100);
  std::stop_source stop;
  stop.request_stop();  // instead of waiting
  const auto fits = [&](std::uint64_t bytes) {
    try {
      const PixelBudget::Share share(&budget, bytes, stop.get_token());
      return true;
    } catch (const Stopped&) {
      return false;
    }
  };
  EXPECT_TRUE(fits(1000));  // alone
  {
    const PixelBudget::Share some(&budget, 60, {});
    EXPECT_TRUE(fits(40));
    EXPECT_FALSE(fits(41));
    EXPECT_FALSE(fits(1000));
    EXPECT_TRUE(fits(0));
  }
  EXPECT_TRUE(fits(100));
  const PixelBudget::Share all(&budget, 1000, {});
  EXPECT_FALSE(fits(1));
  const PixelBudget::Share endless(nullptr, 1000, {});
}

}  // namespace
}  // namespace pelorin::photo
