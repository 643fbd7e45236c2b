// What a JPEG file says of its coding, and files that are made like the photo's own.
#include "photo/jpeg/jpeg_coding.h"

#include <gtest/gtest.h>

#include "photo/filter_photo.h"
#include "photo/photo.h"
#include "tests/support/jpeg_files.h"

namespace pelorin::photo {
namespace {

using test_support::Bytes;
using test_support::JpegRecipe;
using test_support::makeJpeg;

JpegCoding codingOf(const Bytes& file) {
  return readJpegHeader(file).coding;
}

Bytes rewritten(const Bytes& file, const SaveOptions& options = {}, int rotate = 0) {
  const Photo photo = open(file, {.rotate = rotate});
  return save(*photo.image, "JPEG", photo.metadata, options);
}

const JpegRecipe greyPhoto = {.samples = JCS_GRAYSCALE, .stored = JCS_GRAYSCALE};

TEST(JpegCoding, QualityIsThatOfTheTablesInTheFile) {
  for (int quality = 1; quality <= 100; ++quality) {
    const JpegCoding coding = codingOf(makeJpeg({.width = 8, .height = 8, .quality = quality}));
    ASSERT_EQ(coding.tables.size(), 2u);
    EXPECT_EQ(estimatedQuality(coding), quality);
  }
  EXPECT_EQ(codingOf(makeJpeg(greyPhoto)).tables.size(), 1u);
  EXPECT_EQ(estimatedQuality(codingOf(makeJpeg(greyPhoto))), 90);
  EXPECT_EQ(estimatedQuality({}), std::nullopt);
}

TEST(JpegCoding, QualityOfOtherTablesIsTheNearest) {
  JpegCoding coding = codingOf(makeJpeg({.quality = 75}));
  for (auto& table : coding.tables) {
    for (std::size_t i = 0; i < table.size(); i += 2) ++table[i];
  }
  EXPECT_NEAR(*estimatedQuality(coding), 75, 3);
  for (auto& table : coding.tables) table.fill(65535);
  EXPECT_EQ(estimatedQuality(coding), 1);
  for (auto& table : coding.tables) table.fill(0);
  EXPECT_EQ(estimatedQuality(coding), 100);
}

TEST(JpegCoding, FilesAreSampledLikeTheirPhotos) {
  for (const ChromaSampling sampling :
       {ChromaSampling{1, 1}, ChromaSampling{2, 1}, ChromaSampling{1, 2}, ChromaSampling{2, 2},
        ChromaSampling{4, 1}}) {
    const Bytes file =
        makeJpeg({.horizontalSampling = sampling.across, .verticalSampling = sampling.down});
    EXPECT_EQ(codingOf(file).sampling, sampling);
    EXPECT_EQ(codingOf(rewritten(file)).sampling, sampling);
    EXPECT_EQ(codingOf(rewritten(file, {}, 90)).sampling,
              (ChromaSampling{sampling.down, sampling.across}))
        << "turned with the picture";
    EXPECT_EQ(codingOf(rewritten(file, {.sampling = ChromaSampling{2, 1}})).sampling,
              (ChromaSampling{2, 1}));
  }
  // More than libjpeg puts together in one scan.
  const Bytes odd = makeJpeg(
      {.horizontalSampling = 4, .verticalSampling = 4, .scans = test_support::channelScans()});
  EXPECT_EQ(codingOf(odd).sampling, std::nullopt);
  EXPECT_EQ(codingOf(rewritten(odd)).sampling, ChromaSampling{});
}

TEST(JpegCoding, FilesAreProgressiveLikeTheirPhotos) {
  const Bytes progressive = makeJpeg({.scans = test_support::completeProgressiveScans()});
  EXPECT_TRUE(codingOf(rewritten(progressive)).progressive);
  EXPECT_FALSE(codingOf(rewritten(makeJpeg({}))).progressive);
}

TEST(JpegCoding, QualityIsNinetyOrThePhotosOwn) {
  const Bytes file = makeJpeg({.quality = 71});
  EXPECT_EQ(estimatedQuality(codingOf(rewritten(file))), 90);
  EXPECT_EQ(estimatedQuality(codingOf(rewritten(file, {.quality = sourceQuality}))), 71);
  const Bytes png = save(*open(file).image, "PNG");
  EXPECT_EQ(estimatedQuality(codingOf(rewritten(png, {.quality = sourceQuality}))), 90);
}

TEST(JpegCoding, GreyStaysGreyUntilAFilterColoursIt) {
  const Bytes grey = makeJpeg(greyPhoto);
  const auto channelsAfter = [&](const std::string& filter, const std::string& params) {
    const Bytes made = filterPhoto(grey, {.filter = filter, .params = params}).file;
    EXPECT_EQ(codingOf(made).grey, readJpegHeader(made).components == 1);
    return readJpegHeader(made).components;
  };
  EXPECT_EQ(channelsAfter("PassThrough", ""), 1);
  EXPECT_EQ(channelsAfter("AE0", "slider=0.4;"), 1);
  EXPECT_EQ(channelsAfter("AE08bit", "slider=1;"), 1);
  EXPECT_EQ(channelsAfter("SummerRGB", ""), 3);
}

TEST(JpegCoding, ColourInALateRowOfAGreyPhotoColoursTheFile) {
  const Photo photo = open(
      makeJpeg({.width = 40, .height = 600, .samples = JCS_GRAYSCALE, .stored = JCS_GRAYSCALE}));
  photo.image->row(599)[7] = {200, 10, 10, 255};
  Metadata noSource = photo.metadata;
  noSource.coding.reset();
  EXPECT_EQ(save(*photo.image, "JPEG", photo.metadata), save(*photo.image, "JPEG", noSource));
  photo.image->row(599)[7] = {200, 200, 200, 255};
  EXPECT_TRUE(codingOf(save(*photo.image, "JPEG", photo.metadata)).grey);
}

}  // namespace
}  // namespace pelorin::photo
