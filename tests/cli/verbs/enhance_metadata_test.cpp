#include <gmock/gmock.h>

#include <filesystem>

#include "photo/metadata/capture_time.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/exif_payload.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using photo::MetadataSegment;

Bytes colourProfile() {
  Bytes payload = bytesOf(std::string("ICC_PROFILE\0\1\1", 14));
  payload.resize(500, 0x5A);
  return payload;
}

std::vector<MetadataSegment> cameraSegments(int orientation, bool littleEndian) {
  return {{0xE1, exifPayload({orientation, "2024:05:01 12:30:45", "25", "+02:00"}, littleEndian)},
          {0xE1, bytesOf(std::string("http://ns.adobe.com/xap/1.0/\0", 29) +
                         "<rdf:RDF xmlns:rdf='http://www.w3.org/1999/02/22-rdf-syntax-ns#'/>")},
          {0xE2, colourProfile()},
          {0xED, bytesOf(std::string("Photoshop 3.0\0", 14))},
          {0xFE, bytesOf("a comment")}};
}

void expectSegments(const Bytes& file, const std::vector<MetadataSegment>& expected) {
  const std::vector<MetadataSegment> found = photo::readJpegHeader(file).metadata;
  ASSERT_EQ(found.size(), expected.size());
  for (std::size_t i = 0; i < found.size(); ++i) EXPECT_TRUE(found[i] == expected[i]) << i;
}

TEST(KeptMetadata, IsTheSameByteForByteButForTheOrientation) {
  const TemporaryFolder folder;
  for (const bool littleEndian : {false, true}) {
    const std::string in =
        folder.write("a.jpg", jpegOf(photoLikePicture(48, 32, 1), cameraSegments(6, littleEndian)));
    const Finished run =
        quenby({"enhance", in, "-o", folder / "b.jpg", "--overwrite", "--no-mark"});
    EXPECT_EQ(run.exitCode, 0) << run.errors;
    expectSegments(folder.read("b.jpg"), cameraSegments(1, littleEndian));
  }
}

TEST(KeptMetadata, OfACmykFileHasNoColourProfile) {
  const TemporaryFolder folder;
  std::vector<MetadataSegment> segments = cameraSegments(1, true);
  const Bytes cmyk = makeJpeg(
      {.width = 40, .height = 30, .samples = JCS_CMYK, .stored = JCS_CMYK, .metadata = segments});
  const std::string in = folder.write("a.jpg", cmyk);
  const Finished run = quenby({"enhance", in, "-o", folder / "b.jpg", "--no-mark"});
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_THAT(run.errors, testing::HasSubstr("is CMYK, converted to sRGB"));
  segments.erase(segments.begin() + 2);
  expectSegments(folder.read("b.jpg"), segments);
}

TEST(KeptMetadata, SurvivesADamagedExifSegment) {
  const TemporaryFolder folder;
  Bytes exif = exifPayload({6, "", "", ""}, true);
  exif[10] = 0xFF;  // the first directory lies far away
  exif[11] = 0xFF;
  const std::string in = folder.write("a.jpg", jpegOf(photoLikePicture(48, 32, 1), {{0xE1, exif}}));
  EXPECT_EQ(quenby({"enhance", in, "-o", folder / "b.jpg", "--no-mark"}).exitCode, 0);
  expectSegments(folder.read("b.jpg"), {{0xE1, exif}});
  EXPECT_EQ(decoded(folder.read("b.jpg")).width, 48u);
}

TEST(KeptMetadata, ThatIsLostIsNamedOrRefused) {
  const TemporaryFolder folder;
  const MetadataSegment manifest = {
      0xEB, bytesOf(std::string("JP\0\1\0\0\0\1\0\0\0\x40jumb....c2pa", 24))};
  const std::string in = folder.write("a.jpg", jpegOf(photoLikePicture(48, 32, 1), {manifest}));
  const Finished strict = quenby({"enhance", in, "-o", folder / "b.jpg", "--strict-metadata"});
  EXPECT_EQ(strict.exitCode, 1);
  EXPECT_THAT(strict.errors, testing::HasSubstr("C2PA manifest lost: an edit breaks"));
  EXPECT_FALSE(std::filesystem::exists(folder / "b.jpg"));
  const Finished named = quenby({"enhance", in, "-o", folder / "b.jpg", "--json"});
  EXPECT_EQ(named.exitCode, 0);
  EXPECT_THAT(named.errors, testing::HasSubstr("b.jpg: C2PA manifest lost: an edit breaks"));
  EXPECT_THAT(named.output, testing::HasSubstr("\"what\": \"C2PA manifest\""));
}

TEST(KeptMetadata, GoesWhereItIsStripped) {
  const TemporaryFolder folder;
  const std::string in =
      folder.write("a.jpg", jpegOf(photoLikePicture(48, 32, 1), cameraSegments(6, true)));
  const Finished all = quenby(
      {"enhance", in, "-o", folder / "b.jpg", "--strip", "all", "--strict-metadata", "--no-mark"});
  EXPECT_EQ(all.exitCode, 0) << all.errors;
  const auto left = photo::readJpegHeader(folder.read("b.jpg")).metadata;
  ASSERT_EQ(left.size(), 2u);  // JFIF and the colour profile
  EXPECT_EQ(left[1].payload, colourProfile());
  EXPECT_EQ(quenby({"enhance", in, "-o", folder / "c.jpg", "--strip", "everything"}).exitCode, 2);
  EXPECT_EQ(
      quenby({"enhance", in, "-o", folder / "c.jpg", "--keep", "time,iptc", "--no-mark"}).exitCode,
      0);
  const auto kept = photo::readJpegHeader(folder.read("c.jpg")).metadata;
  ASSERT_EQ(kept.size(), 3u);
  EXPECT_EQ(photo::exifCaptureTime(kept[0].payload)->text,
            photo::exifCaptureTime(cameraSegments(6, true)[0].payload)->text);
  EXPECT_EQ(kept[2].payload, cameraSegments(6, true)[3].payload);
  const Finished wrong = quenby({"enhance", in, "-o", folder / "d.jpg", "--keep", "time,artist"});
  EXPECT_EQ(wrong.exitCode, 2);
  EXPECT_THAT(wrong.errors, testing::HasSubstr("--keep: 'artist' is none of copyright, time"));
}

TEST(Upright, IsEveryOneOfTheEightOrientations) {
  const TemporaryFolder folder;
  for (int orientation = 1; orientation <= 8; ++orientation) {
    const std::vector<MetadataSegment> segments = cameraSegments(orientation, true);
    const Bytes file = jpegOf(photoLikePicture(48, 32, 1), segments);
    const std::string in = folder.write("a.jpg", file);
    const Finished run = quenby({"enhance", in, "-o", folder / "b.jpg", "--overwrite", "--no-mark",
                                 "--filter", "PassThrough"});
    EXPECT_EQ(run.exitCode, 0) << run.errors;

    const Image<RGBA8Pixel> stored = decoded(file);
    const bool sideways = orientation >= 5;
    Image<RGBA8Pixel> upright(sideways ? stored.height : stored.width,
                              sideways ? stored.width : stored.height);
    const std::uint32_t right = stored.width - 1, bottom = stored.height - 1;
    for (std::uint32_t y = 0; y < upright.height; ++y) {
      for (std::uint32_t x = 0; x < upright.width; ++x) {
        const std::uint32_t column[] = {x, right - x, right - x, x, y, y, right - y, right - y};
        const std::uint32_t row[] = {y, y, bottom - y, bottom - y, x, bottom - x, bottom - x, x};
        upright.row(y)[x] = stored.row(row[orientation - 1])[column[orientation - 1]];
      }
    }
    EXPECT_EQ(folder.read("b.jpg"), jpegOf(upright, cameraSegments(1, true))) << orientation;
  }
}

TEST(Upright, IsWhatFacesReferTo) {
  const TemporaryFolder folder;
  // The dark left half as stored is the upper half of the upright picture.
  Image<RGBA8Pixel> halves(64, 32);
  for (std::uint32_t y = 0; y < 32; ++y) {
    for (std::uint32_t x = 0; x < 64; ++x) {
      const std::uint8_t grey = x < 32 ? 40 : 200;
      halves.row(y)[x] = {grey, grey, grey, 255};
    }
  }
  const std::string in =
      folder.write("a.jpg", jpegOf(halves, {{0xE1, exifPayload({6, "", "", ""}, true)}}));
  const auto faceMedian = [&](const std::string& face) {
    const std::string output = quenby({"info", in, "--jsonl", "--face", face}).output;
    return std::stoi(output.substr(output.find("\"faceMedianBin\":") + 16));
  };
  EXPECT_LT(faceMedian("0.1,0.1,0.9,0.4"), 15);
  EXPECT_GT(faceMedian("0.1,0.6,0.9,0.9"), 35);
}

}  // namespace
}  // namespace pelorin::test_support
