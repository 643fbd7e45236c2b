// A chart in the spaces that cameras and editors use: its numbers are what a filter works on, and the
// profile goes along byte for byte, so that the colours stay what they were.
#include <gtest/gtest.h>
#include <lcms2.h>

#include <algorithm>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "photo/filter_photo.h"
#include "photo/metadata/segments.h"
#include "photo/photo.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::photo {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;
using Bytes = std::vector<std::uint8_t>;

struct Space {
  const char* name;
  double whiteX, whiteY;
  cmsCIExyYTRIPLE primaries;
  double gamma;
};

const Space spaces[] = {
    {"Display P3", 0.3127, 0.3290, {{0.680, 0.320, 1}, {0.265, 0.690, 1}, {0.150, 0.060, 1}}, 2.2},
    {"Adobe RGB", 0.3127, 0.3290, {{0.640, 0.330, 1}, {0.210, 0.710, 1}, {0.150, 0.060, 1}}, 2.2},
    {"ProPhoto",
     0.3457,
     0.3585,
     {{0.7347, 0.2653, 1}, {0.1596, 0.8404, 1}, {0.0366, 0.0001, 1}},
     1.8}};

Bytes bytesOf(cmsHPROFILE profile) {
  cmsUInt32Number size = 0;
  cmsSaveProfileToMem(profile, nullptr, &size);
  Bytes bytes(size);
  cmsSaveProfileToMem(profile, bytes.data(), &size);
  cmsCloseProfile(profile);
  return bytes;
}

Bytes profileOf(const Space& space) {
  const cmsCIExyY white = {space.whiteX, space.whiteY, 1};
  cmsToneCurve* const curve = cmsBuildGamma(nullptr, space.gamma);
  cmsToneCurve* const curves[] = {curve, curve, curve};
  const cmsHPROFILE profile = cmsCreateRGBProfile(&white, &space.primaries, curves);
  cmsFreeToneCurve(curve);
  return bytesOf(profile);
}

Bytes greyProfile() {
  const cmsCIExyY white = {0.3457, 0.3585, 1};
  cmsToneCurve* const curve = cmsBuildGamma(nullptr, 2.2);
  const cmsHPROFILE profile = cmsCreateGrayProfile(&white, curve);
  cmsFreeToneCurve(curve);
  return bytesOf(profile);
}

// Patches of 8 x 8 pixels, 6 levels of each channel.
Image<RGBA8Pixel> chart() {
  Image<RGBA8Pixel> picture(36 * 8, 6 * 8);
  for (std::uint32_t y = 0; y < picture.height; ++y) {
    for (std::uint32_t x = 0; x < picture.width; ++x) {
      const auto level = [](std::uint32_t i) { return static_cast<std::uint8_t>(i * 51); };
      picture.row(y)[x] = {level(x / 8 % 6), level(x / 48), level(y / 8), 255};
    }
  }
  return picture;
}

Metadata withProfile(const Bytes& profile, const Image<RGBA8Pixel>& picture) {
  Metadata metadata = {.segments = {}, .storedSize = {picture.width, picture.height}};
  addColourProfile(profile, metadata.segments);
  return metadata;
}

std::vector<cmsCIELab> labOf(const Image<RGBA8Pixel>& picture, const Bytes& profile) {
  const cmsHPROFILE from =
      cmsOpenProfileFromMem(profile.data(), static_cast<cmsUInt32Number>(profile.size()));
  const cmsHPROFILE to = cmsCreateLab4Profile(nullptr);
  const cmsHTRANSFORM transform =
      cmsCreateTransform(from, TYPE_RGBA_8, to, TYPE_Lab_DBL, INTENT_RELATIVE_COLORIMETRIC, 0);
  std::vector<cmsCIELab> lab(picture.pixelCount());
  cmsDoTransform(transform, picture.data.get(), lab.data(),
                 static_cast<cmsUInt32Number>(lab.size()));
  cmsDeleteTransform(transform);
  cmsCloseProfile(from);
  cmsCloseProfile(to);
  return lab;
}

bool samePixels(const Image<RGBA8Pixel>& a, const Image<RGBA8Pixel>& b) {
  return a.width == b.width && a.height == b.height &&
         std::memcmp(a.data.get(), b.data.get(), a.byteSize()) == 0;
}

TEST(ColourProfiles, GoAlongByteForByteAndTheNumbersAreTheFiles) {
  const Image<RGBA8Pixel> picture = chart();
  for (const Space& space : spaces) {
    const Bytes profile = profileOf(space);
    ASSERT_GT(profile.size(), 128u);
    const Bytes png = save(picture, "PNG", withProfile(profile, picture));
    const Photo read = open(png);
    EXPECT_TRUE(samePixels(*read.image, picture)) << space.name;
    for (const std::string_view format : {"PNG", "JPEG"}) {
      const Bytes file = save(*read.image, format, read.metadata, {.quality = 100});
      const Photo again = open(file);
      EXPECT_EQ(colourProfileOf(again.metadata.segments), profile) << space.name << format;
      // What a viewer shows by the profile is the chart.
      const auto before = labOf(picture, profile), after = labOf(*again.image, profile);
      double worst = 0;
      for (std::uint32_t y = 4; y < picture.height; y += 8) {  // the patches' middles
        for (std::uint32_t x = 4; x < picture.width; x += 8) {
          const std::size_t i = std::size_t{y} * picture.width + x;
          worst = std::max(worst, cmsDeltaE(&before[i], &after[i]));
        }
      }
      EXPECT_LE(worst, format == "PNG" ? 0 : 4) << space.name << format;
    }
  }
}

TEST(ColourProfiles, DoNotChangeWhatAFilterMakesOfTheNumbers) {
  const Image<RGBA8Pixel> picture = chart();
  const FilterRequest request = {.filter = "AE0", .params = "slider=0.7;"};
  const Bytes plain = filterPhoto(save(picture, "PNG"), request, formatNamed("PNG")).file;
  const Photo expected = open(plain);
  EXPECT_FALSE(samePixels(*expected.image, picture));
  for (const Space& space : spaces) {
    const Bytes profile = profileOf(space);
    const Bytes file = save(picture, "PNG", withProfile(profile, picture));
    const Photo filtered = open(filterPhoto(file, request, formatNamed("PNG")).file);
    EXPECT_TRUE(samePixels(*filtered.image, *expected.image)) << space.name;
    EXPECT_EQ(colourProfileOf(filtered.metadata.segments), profile) << space.name;
  }
}

TEST(ColourProfiles, ForGreyStayAsLongAsTheResultIsGrey) {
  const Bytes profile = greyProfile();
  const std::vector<Loss> lost = {{"colour profile", "is for grey, and the result is in colour"}};
  const Bytes jpeg = test_support::makeJpeg(
      {.samples = JCS_GRAYSCALE, .stored = JCS_GRAYSCALE, .profile = profile});
  for (const int rotate : {0, 90}) {
    const FilteredPhoto grey =
        filterPhoto(jpeg, {.filter = "AE0", .params = "slider=0.4;", .open = {.rotate = rotate}});
    EXPECT_EQ(colourProfileOf(open(grey.file).metadata.segments), profile);
    EXPECT_TRUE(grey.lost.empty());
    EXPECT_TRUE(grey.facts.notices.empty());
  }
  const FilteredPhoto coloured = filterPhoto(jpeg, {.filter = "SummerRGB", .params = ""});
  EXPECT_TRUE(colourProfileOf(open(coloured.file).metadata.segments).empty());
  EXPECT_EQ(coloured.lost, lost);
  const FilteredPhoto converted =
      filterPhoto(jpeg, {.filter = "PassThrough", .params = ""}, formatNamed("PNG"));
  EXPECT_TRUE(colourProfileOf(open(converted.file).metadata.segments).empty());
  EXPECT_EQ(converted.lost, lost);

  const Image<RGBA8Pixel> picture = chart();
  const Photo png =
      open(save(picture, "PNG", withProfile(profile, picture), {.colour = ColourDetail::none}));
  EXPECT_EQ(colourProfileOf(png.metadata.segments), profile);
  for (const std::string_view format : {"PNG", "JPEG"}) {
    std::vector<Loss> losses;
    const Bytes file = save(*png.image, format, png.metadata, {}, &losses);
    EXPECT_TRUE(colourProfileOf(open(file).metadata.segments).empty());
    EXPECT_EQ(losses, lost);
  }
}

}  // namespace
}  // namespace pelorin::photo
