#include "photo/format.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <string>

#include "photo/photo.h"
#include "tests/support/pictures.h"

namespace pelorin::photo {
namespace {

using namespace std::string_view_literals;
using testing::HasSubstr;
using testing::MatchesRegex;
using testing::StartsWith;

std::vector<std::uint8_t> fileOf(std::string_view beginning) {
  std::vector<std::uint8_t> file(beginning.begin(), beginning.end());
  file.resize(600);
  return file;
}

std::string errorOf(std::string_view beginning, PhotoError::Kind kind) {
  try {
    open(fileOf(beginning));
  } catch (const PhotoError& error) {
    EXPECT_EQ(error.kind(), kind) << beginning;
    return error.what();
  }
  return "";
}

TEST(FormatTable, FindsFormatsByNameExtensionAndContent) {
  const auto picture = test_support::noisePicture(9, 7, 1);
  for (const Format& format : formats()) {
    EXPECT_EQ(formatNamed(format.name), &format);
    for (const std::string_view extension : format.extensions)
      EXPECT_EQ(formatWithExtension(extension), &format);
    if (&format == &rawPixels()) continue;
    EXPECT_EQ(&formatOf(save(picture, format)), &format);
  }
  EXPECT_EQ(formatWithExtension(".JpG"), formatNamed("JPEG"));
  EXPECT_EQ(formatWithExtension(".gif"), nullptr);
  EXPECT_EQ(formatWithExtension(""), nullptr);
  EXPECT_EQ(formatNamed("GIF"), nullptr);
  EXPECT_TRUE(isPictureExtension(".png"));
  EXPECT_FALSE(isPictureExtension(".rgba"));
  EXPECT_THAT(pictureFormats(), MatchesRegex("JPEG(, [^ ]+)* or [^ ]+"));
  EXPECT_THAT(pictureExtensions(),
              MatchesRegex("\\.jpg, \\.jpeg, \\.jpe(, \\.[^ ]+)* or \\.[^ ]+"));
  for (const Format& format : formats()) {
    const bool isPicture = &format != &rawPixels();
    EXPECT_EQ(pictureFormats().find(format.name) != std::string::npos, isPicture) << format.name;
    for (const std::string_view extension : format.extensions)
      EXPECT_EQ(pictureExtensions().find(extension) != std::string::npos, isPicture) << extension;
    EXPECT_EQ(lossyFormats().find(format.name) != std::string::npos, format.losesDetail);
  }
  EXPECT_EQ(usualFormat().name, "JPEG");
}

TEST(FormatTable, NamesWhatItCannotRead) {
  const auto kind = PhotoError::Kind::unsupported;
  for (const auto& [beginning, name] : {
           std::pair{"\0\0\0\x18"
                     "ftypheic\0\0\0\0mif1heic"sv,
                     "a HEIC photo"},
           {"\0\0\0\x18"
            "ftypmif1\0\0\0\0heicmif1"sv,
            "a HEIC photo"},
           {"\0\0\0\x1C"
            "ftypavif\0\0\0\0mif1avif"sv,
            "an AVIF photo"},
           {"\0\0\0\x18"
            "ftypcrx \0\0\0\1crx isom"sv,
            "a Canon raw photo (CR3)"},
           {"RIFF\0\0\0\0WEBPVP8 "sv, "a WebP picture"},
           {"II*\0\x10\0\0\0CR\2\0"sv, "a Canon raw photo (CR2)"},
           {"MM\0*\0\0\0\x08....NIKON CORPORATION"sv, "a Nikon raw photo (NEF)"},
           {"II*\0\x08\0\0\0....SONY "sv, "a Sony raw photo (ARW)"},
           {"II*\0\x08\0\0\0..\x12\xC6\x01\0\x04\0\0\0\1\4\0\0"sv, "a raw photo (DNG)"},
           {"FUJIFILMCCD-RAW 0201"sv, "a Fujifilm raw photo (RAF)"},
           {"IIRO\x08\0\0\0"sv, "an Olympus raw photo (ORF)"},
           {"IIU\0\x18\0\0\0"sv, "a Panasonic raw photo (RW2)"},
           {"II*\0\x08\0\0\0"sv, "a TIFF picture"},
           {"MM\0*\0\0\0\x08"sv, "a TIFF picture"},
           {"GIF89a"sv, "a GIF picture"},
           {"BM\x36\x10\0\0\0\0\0\0"sv, "a BMP picture"},
       }) {
    const std::string error = errorOf(beginning, kind);
    EXPECT_THAT(error, StartsWith(name));
    EXPECT_THAT(error, HasSubstr("; convert it first, for example with: "));
  }
}

TEST(FormatTable, NamesTransparencyThatAFormatCannotHold) {
  for (const Format& format : formats()) {
    auto picture = test_support::flatPicture(37, 131, {9, 8, 7, 255});
    std::vector<Loss> lost;
    save(picture, format, {}, {}, &lost);
    EXPECT_TRUE(lost.empty()) << format.name;
    for (const std::size_t pixel :
         {std::size_t{0}, std::size_t{37 * 100}, picture.pixelCount() - 1}) {
      picture.data.get()[pixel].a = 254;
      save(picture, format, {}, {}, &lost);
      EXPECT_EQ(lost.size(), format.keepsAlpha ? 0u : 1u) << format.name << ", pixel " << pixel;
      picture.data.get()[pixel].a = 255;
    }
  }
}

TEST(FormatTable, RefusesWhatIsNoPhoto) {
  EXPECT_EQ(errorOf("a letter to a friend", PhotoError::Kind::notAPhoto),
            "not a " + pictureFormats() + " file");
  try {
    open({});
    ADD_FAILURE();
  } catch (const PhotoError& error) {
    EXPECT_EQ(error.kind(), PhotoError::Kind::empty);
  }
  const auto picture = test_support::noisePicture(2, 2, 1);
  EXPECT_THROW(save(picture, "GIF"), PhotoError);
}

TEST(FormatTable, ReadsRowsOfAnyNumberAtATimeAsTheWholePicture) {
  const auto picture = test_support::noisePicture(40, 50, 2);
  for (const Format& format : formats()) {
    const auto file = save(picture, format);
    OpenOptions options;
    if (&format == &rawPixels()) options.raw = {40, 50};
    for (const int scale : {1, 2, 8}) {
      options.scale = scale;
      const Photo whole = open(file, options);
      const auto reader = openRows(file, options);
      ASSERT_EQ(reader->size(), (PictureSize{whole.image->width, whole.image->height}));
      std::vector<image_processing::RGBA8Pixel> rows(whole.image->pixelCount());
      const std::uint32_t height = reader->size().height;
      for (std::uint32_t y = 0; y < height;) {
        const std::uint32_t count = std::min(1 + y % 7, height - y);
        reader->read(rows.data() + std::size_t{y} * reader->size().width, count);
        y += count;
      }
      EXPECT_EQ(std::memcmp(rows.data(), whole.image->data.get(), whole.image->byteSize()), 0)
          << format.name << " at 1/" << scale;
    }
  }
}

TEST(FormatTable, WritesRowsOfAnyNumberAtATimeAsTheWholePicture) {
  const auto picture = test_support::noisePicture(40, 50, 2);
  for (const Format& format : formats()) {
    const auto writer = format.writer({40, 50}, true, {}, {});
    for (std::uint32_t y = 0; y < 50;) {
      const std::uint32_t count = std::min(1 + y % 7, 50 - y);
      writer->write(picture.row(y), count);
      y += count;
    }
    EXPECT_EQ(writer->finish({}), save(picture, format)) << format.name;
  }
}

}  // namespace
}  // namespace pelorin::photo
