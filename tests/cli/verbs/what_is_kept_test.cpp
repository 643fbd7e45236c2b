// Photos as phones and cameras write them through the built command; ExifTool, where it is installed,
// judges the files.
#include <gmock/gmock.h>

#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <map>
#include <set>
#include <sstream>

#include "photo/area_average.h"
#include "photo/jpeg/jpeg_codec.h"
#include "photo/metadata/segments.h"
#include "photo/metadata/tiff.h"
#include "photo/metadata/xmp_regions.h"
#include "photo/metadata/xmp_segments.h"
#include "photo/photo.h"
#include "tests/cli/quenby_process.h"
#include "tests/photo/metadata/phone_photos.h"
#include "tests/photo/metadata/xmp_texts.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;

constexpr std::uint32_t width = 320, height = 160;

// With a magenta face around 0.25, 0.5 of the stored picture.
Image<RGBA8Pixel> paintedPicture() {
  Image<RGBA8Pixel> picture = photoLikePicture(width, height, 3);
  for (std::uint32_t y = 60; y < 100; ++y) {
    for (std::uint32_t x = 60; x < 100; ++x) picture.row(y)[x] = {230, 20, 200, 255};
  }
  return picture;
}

const std::string regions =
    "<rdf:Description tiff:Orientation='6' exif:PixelXDimension='320' exif:PixelYDimension='160'>"
    "<mwg-rs:Regions rdf:parseType='Resource'><mwg-rs:AppliedToDimensions stDim:w='320' "
    "stDim:h='160' stDim:unit='pixel'/><mwg-rs:RegionList><rdf:Bag><rdf:li "
    "rdf:parseType='Resource'><mwg-rs:Type>Face</mwg-rs:Type><mwg-rs:Area stArea:x='0.25' "
    "stArea:y='0.5' stArea:w='0.1' stArea:h='0.2' stArea:unit='normalized'/></rdf:li></rdf:Bag>"
    "</mwg-rs:RegionList></mwg-rs:Regions><MP:RegionInfo rdf:parseType='Resource'><MPRI:Regions>"
    "<rdf:Bag><rdf:li MPReg:Rectangle='0.2, 0.4, 0.1, 0.2'/></rdf:Bag></MPRI:Regions>"
    "</MP:RegionInfo></rdf:Description>";

Bytes cameraPhoto(int orientation) {
  const Bytes thumbnail = jpegWith(photoLikePicture(160, 120, 9));
  return jpegWith(paintedPicture(), {{0xE1, cameraExif({.orientation = orientation,
                                                        .width = width,
                                                        .height = height,
                                                        .thumbnail = thumbnail})},
                                     xmpSegment(xmpPacket(regions, 500))});
}

// Levels RMS between the EXIF thumbnail and the picture at its size.
double thumbnailError(const std::vector<photo::MetadataSegment>& segments,
                      const photo::DecodedPicture& picture) {
  const auto exif = photo::contentOf(segments, 0xE1, photo::exifMark);
  const photo::Tiff tiff(exif);
  const photo::TiffDirectory second = tiff.nextDirectory(tiff.firstDirectory());
  const photo::TiffEntry *offset = second.find(0x0201), *length = second.find(0x0202);
  if (offset == nullptr || length == nullptr) return 256;
  const photo::DecodedPicture thumbnail =
      photo::decodeJpeg(exif.subspan(tiff.number(*offset), tiff.number(*length)));
  Image<RGBA8Pixel> whole(picture.width, picture.height);
  std::memcpy(static_cast<void*>(whole.data.get()), picture.pixels.get(), whole.byteSize());
  const Image<RGBA8Pixel> expected = photo::areaAverage(whole, {thumbnail.width, thumbnail.height});
  double sum = 0;
  for (std::size_t i = 0; i < expected.pixelCount(); ++i) {
    const RGBA8Pixel& pixel = expected.data.get()[i];
    const std::uint8_t* shown = thumbnail.pixels.get() + 4 * i;
    for (const int difference : {pixel.r - shown[0], pixel.g - shown[1], pixel.b - shown[2]})
      sum += difference * difference;
  }
  return std::sqrt(sum / (3.0 * static_cast<double>(expected.pixelCount())));
}

// A trailer of Samsung's with a video, places counted back from its table.
Bytes samsungTrailer() {
  const Bytes film = video();
  const std::string block = std::string("\0\0\x30\x0A\x10\0\0\0MotionPhoto_Data", 24) +
                            std::string(film.begin(), film.end());
  const auto little = [](std::size_t value) {
    return std::string{static_cast<char>(value), static_cast<char>(value >> 8), 0, 0};
  };
  const std::string table = "SEFH" + little(107) + little(1) + std::string("\0\0\x30\x0A", 4) +
                            little(block.size()) + little(block.size());
  return bytesOf(block + table + little(table.size()) + "SEFT");
}

Bytes photoWithExtendedXmp(int orientation) {
  std::vector<photo::MetadataSegment> segments = {
      {0xE1, cameraExif({.orientation = orientation, .width = width, .height = height})},
      xmpSegment(xmpPacket(regions))};
  std::vector<photo::Loss> lost;
  photo::editXmp(
      segments,
      [](photo::XmpPacket& packet) {
        packet.add({"urn:something:unknown", "Large"}, "my", std::string(70'000, 'x'));
      },
      lost);
  EXPECT_TRUE(lost.empty());
  return jpegWith(paintedPicture(), segments);
}

bool hasExifTool() {
  static const bool has = std::system("exiftool -ver > /dev/null 2>&1") == 0;
  return has;
}

// What ExifTool warns of in the files of a folder, line by line. Starting it takes long, so it is
// asked once for all.
std::map<std::string, std::set<std::string>> warningsIn(const TemporaryFolder& folder) {
  std::map<std::string, std::set<std::string>> warnings;
  FILE* pipe =
      popen(("exiftool -validate -warning -error -a '" + (folder / "") + "' 2>&1").c_str(), "r");
  std::string output;
  for (int letter = std::fgetc(pipe); letter != EOF; letter = std::fgetc(pipe))
    output += static_cast<char>(letter);
  pclose(pipe);
  std::istringstream stream(output);
  std::string file;
  for (std::string line; std::getline(stream, line);) {
    if (line.rfind("======== ", 0) == 0) {
      file = line.substr(line.rfind('/') + 1);
      warnings[file];
    } else if (line.find(" : ") != std::string::npos && line.rfind("Validate", 0) != 0) {
      warnings[file].insert(line);
    }
  }
  return warnings;
}

// Each b stands beside the a that it was made of.
void expectNoNewWarnings(const TemporaryFolder& folder, std::size_t files) {
  const auto warnings = warningsIn(folder);
  ASSERT_EQ(warnings.size(), 2 * files);
  for (const auto& [name, lines] : warnings) {
    if (name[0] == 'a') continue;
    for (const std::string& line : lines)
      EXPECT_TRUE(warnings.at("a" + name.substr(1)).contains(line)) << name << ": " << line;
  }
}

TEST(WhatIsKept, FacesStandOnTheirColourInEveryOrientationAndSize) {
  const TemporaryFolder folder;
  std::size_t files = 0;
  for (int orientation = 1; orientation <= 8; ++orientation) {
    for (const std::string scale : {"1", "2"}) {
      const std::string name = std::to_string(++files) + ".jpg";
      const std::string in = folder.write("a" + name, cameraPhoto(orientation));
      const Finished run = quenby({"enhance", in, "-o", folder / ("b" + name), "--scale", scale,
                                   "--filter", "PassThrough", "--strict-metadata"});
      ASSERT_EQ(run.exitCode, 0) << run.errors;
      const Bytes file = folder.read("b" + name);
      const photo::DecodedPicture picture = photo::decodeJpeg(file);
      std::vector<photo::MetadataSegment> segments = photo::readJpegHeader(file).metadata;
      std::vector<photo::Loss> lost;
      photo::editXmp(
          segments,
          [&](photo::XmpPacket& packet) {
            const photo::PictureSize size = {picture.width, picture.height};
            const std::vector<photo::KnownFace> faces = photo::facesOf(packet, {size, size, {}, 1});
            ASSERT_EQ(faces.size(), 1u);
            const auto x =
                static_cast<std::size_t>((faces[0].left + faces[0].right) / 2 * picture.width);
            const auto y =
                static_cast<std::size_t>((faces[0].top + faces[0].bottom) / 2 * picture.height);
            const std::uint8_t* pixel = picture.pixels.get() + 4 * (y * picture.width + x);
            EXPECT_NEAR(pixel[0], 230, 12) << orientation;
            EXPECT_NEAR(pixel[1], 20, 12) << orientation;
            EXPECT_NEAR(pixel[2], 200, 12) << orientation;
          },
          lost);
      // A smaller picture is no larger than the thumbnail, and its own coding is what is measured.
      if (scale == "1") {
        EXPECT_LT(thumbnailError(segments, picture), 3) << orientation;
      }
    }
  }
  if (hasExifTool()) expectNoNewWarnings(folder, files);
}

TEST(WhatIsKept, FacesOfAFileAreUsedUnlessItIsSaidOtherwise) {
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", cameraPhoto(6));
  const auto enhanced = [&](const std::vector<std::string>& options) {
    std::vector<std::string> arguments = {"enhance", in, "-o", folder / "b.jpg", "--overwrite"};
    arguments.insert(arguments.end(), options.begin(), options.end());
    EXPECT_EQ(quenby(arguments).exitCode, 0);
    return folder.read("b.jpg");
  };
  // The stored 0.2 ... 0.3 across and 0.4 ... 0.6 down, a quarter clockwise.
  const std::string sameFace = "0.4,0.2,0.6,0.3";
  const Bytes known = enhanced({});
  EXPECT_EQ(known, enhanced({"--faces", "none", "--face", sameFace}));
  EXPECT_NE(known, enhanced({"--faces", "none"}));
  const Finished info = quenby({"info", in});
  EXPECT_THAT(info.output, testing::HasSubstr("0.400,0.200,0.600,0.300"));
  const std::string told = quenby({"info", in, "--json"}).output;
  const std::string faces = folder.write("faces.json", told);
  EXPECT_EQ(known, enhanced({"--faces", faces}));
  folder.write("faces.json", std::string("[{\"file\": \"c.jpg\", \"faces\": []}]"));
  const Finished without = quenby({"enhance", in, "-o", folder / "c.jpg", "--faces", faces});
  EXPECT_EQ(without.exitCode, 1);
  EXPECT_THAT(without.errors, testing::HasSubstr("has no entry for this photo"));
}

TEST(WhatIsKept, PassesExifToolWithGainMapsVideosAndExtendedXmp) {
  if (!hasExifTool()) GTEST_SKIP() << "exiftool is not installed";
  const TemporaryFolder folder;
  std::size_t files = 0;
  // The command's own way from bytes to bytes, without a process for each.
  const auto rewrite = [&](const Bytes& file) {
    const std::string name = std::to_string(++files) + ".jpg";
    folder.write("a" + name, file);
    const photo::Photo photo = photo::open(file);
    folder.write("b" + name, photo::save(*photo.image, "JPEG", photo.metadata));
  };
  for (int orientation = 1; orientation <= 8; ++orientation) {
    for (const Bytes& tail :
         {gainMap(false), gainMap(true), joined({gainMap(), video()}), video(), samsungTrailer(),
          joined({gainMap(), samsungTrailer()}), jpegWith(photoLikePicture(16, 16, 2)), Bytes{}})
      rewrite(phonePhoto(orientation, tail));
    rewrite(photoWithExtendedXmp(orientation));
  }
  expectNoNewWarnings(folder, files);
}

}  // namespace
}  // namespace pelorin::test_support
