// Photos as phones and cameras write them through the built command; ExifTool, where it is installed,
// judges the files.
#include <gmock/gmock.h>

#include <cstdio>
#include <cstdlib>
#include <map>
#include <set>
#include <sstream>

#include "photo/jpeg/jpeg_codec.h"
#include "photo/metadata/xmp_regions.h"
#include "photo/metadata/xmp_segments.h"
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

TEST(WhatIsKept, PassesExifToolWithGainMapsAndVideos) {
  if (!hasExifTool()) GTEST_SKIP() << "exiftool is not installed";
  const TemporaryFolder folder;
  std::size_t files = 0;
  for (const Bytes& tail : {gainMap(false), gainMap(true), joined({gainMap(), video()}), video(),
                            jpegWith(photoLikePicture(16, 16, 2)), Bytes{}}) {
    for (int orientation = 1; orientation <= 8; ++orientation) {
      const std::string name = std::to_string(++files) + ".jpg";
      const std::string in = folder.write("a" + name, phonePhoto(orientation, tail));
      const Finished run = quenby({"enhance", in, "-o", folder / ("b" + name)});
      ASSERT_EQ(run.exitCode, 0) << run.errors;
    }
  }
  expectNoNewWarnings(folder, files);
}

}  // namespace
}  // namespace pelorin::test_support
