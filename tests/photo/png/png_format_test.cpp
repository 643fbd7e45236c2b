// PNG files as other programs write them, made with libpng itself.
#include "photo/png/png_format.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <png.h>
#include <zlib.h>

#include <cstring>
#include <string>

#include "photo/photo.h"
#include "tests/support/bytes.h"
#include "tests/support/pictures.h"

namespace pelorin::photo {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;
using test_support::Bytes;
using test_support::bytesOf;
using testing::HasSubstr;

struct Recipe {
  int colourType = PNG_COLOR_TYPE_RGB;
  int depth = 8;
  bool interlaced = false;
  std::uint32_t width = 13, height = 11;
  std::vector<PngChunk> chunks = {};
  bool keyed = false;  ///< One grey or colour is transparent.
};

// Any samples, the same for every recipe with as many bytes.
Bytes samplesOf(std::size_t count) {
  Bytes samples(count);
  for (std::size_t i = 0; i < count; ++i) samples[i] = static_cast<std::uint8_t>(i * 37 + i / 5);
  return samples;
}

std::size_t rowSize(const Recipe& recipe) {
  const int channels = recipe.colourType == PNG_COLOR_TYPE_PALETTE ? 1
                       : (recipe.colourType & PNG_COLOR_MASK_COLOR) != 0
                           ? 3 + (recipe.colourType & PNG_COLOR_MASK_ALPHA) / PNG_COLOR_MASK_ALPHA
                           : 1 + (recipe.colourType & PNG_COLOR_MASK_ALPHA) / PNG_COLOR_MASK_ALPHA;
  return (std::size_t{recipe.width} * channels * recipe.depth + 7) / 8;
}

Bytes makePng(const Recipe& recipe) {
  Bytes file;
  png_structp png = png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
  png_infop info = png_create_info_struct(png);
  png_set_write_fn(
      png, &file,
      [](png_structp p, png_bytep bytes, std::size_t count) {
        auto* out = static_cast<Bytes*>(png_get_io_ptr(p));
        out->insert(out->end(), bytes, bytes + count);
      },
      nullptr);
  png_set_IHDR(png, info, recipe.width, recipe.height, recipe.depth, recipe.colourType,
               recipe.interlaced ? PNG_INTERLACE_ADAM7 : PNG_INTERLACE_NONE,
               PNG_COMPRESSION_TYPE_DEFAULT, PNG_FILTER_TYPE_DEFAULT);
  std::vector<png_color> palette(16);
  for (int i = 0; i < 16; ++i) palette[i] = {png_byte(i * 3), png_byte(i * 5), png_byte(i * 7)};
  if (recipe.colourType == PNG_COLOR_TYPE_PALETTE) {
    png_set_PLTE(png, info, palette.data(), 1 << recipe.depth);
    const png_byte alpha[2] = {10, 200};
    if (recipe.keyed) png_set_tRNS(png, info, alpha, 2, nullptr);
  }
  png_write_info(png, info);
  for (const PngChunk& chunk : recipe.chunks) {
    png_write_chunk(png, reinterpret_cast<png_const_bytep>(chunk.type.c_str()), chunk.data.data(),
                    chunk.data.size());
  }
  Bytes samples = samplesOf(rowSize(recipe) * recipe.height);
  std::vector<png_bytep> rows;
  for (std::uint32_t y = 0; y < recipe.height; ++y)
    rows.push_back(samples.data() + y * rowSize(recipe));
  png_write_image(png, rows.data());
  png_write_end(png, nullptr);
  png_destroy_write_struct(&png, &info);
  return file;
}

// A TIFF file of one directory that states an orientation.
Bytes exifOf(std::uint8_t orientation) {
  return {'M', 'M', 0, 42, 0, 0, 0,           8, 0, 1, 1, 0x12, 0,
          3,   0,   0, 0,  1, 0, orientation, 0, 0, 0, 0, 0,    0};
}

std::string errorOf(const Bytes& file, PhotoError::Kind* kind = nullptr) {
  try {
    open(file);
  } catch (const PhotoError& error) {
    if (kind != nullptr) *kind = error.kind();
    return error.what();
  }
  return "";
}

Image<RGBA8Pixel> opaque(Image<RGBA8Pixel> picture) {
  for (std::size_t i = 0; i < picture.pixelCount(); ++i) picture.data.get()[i].a = 255;
  return picture;
}

Image<RGBA8Pixel> seeThrough(std::uint32_t width, std::uint32_t height) {
  Image<RGBA8Pixel> picture = test_support::noisePicture(width, height, 3);
  for (std::size_t i = 0; i < picture.pixelCount(); ++i)
    picture.data.get()[i].a = static_cast<std::uint8_t>(i * 11);
  return picture;
}

void expectSamePixels(const Image<RGBA8Pixel>& a, const Image<RGBA8Pixel>& b) {
  ASSERT_EQ(a.width, b.width);
  ASSERT_EQ(a.height, b.height);
  EXPECT_EQ(std::memcmp(a.data.get(), b.data.get(), a.byteSize()), 0);
}

TEST(PngFormat, ReadsWhatItWroteAlphaIncluded) {
  const Image<RGBA8Pixel> solid = opaque(test_support::noisePicture(17, 9, 1));
  const Image<RGBA8Pixel> transparent = seeThrough(300, 700);
  for (const auto* picture : {&solid, &transparent}) {
    const Photo photo = open(save(*picture, "PNG"));
    expectSamePixels(*photo.image, *picture);
    EXPECT_EQ(photo.facts.format, "PNG");
    EXPECT_EQ(photo.facts.hasAlpha, picture == &transparent);
    EXPECT_TRUE(photo.facts.notices.empty());
  }
}

TEST(PngFormat, WritesGreyPicturesInOneChannel) {
  Image<RGBA8Pixel> grey(256, 2);
  for (std::size_t i = 0; i < grey.pixelCount(); ++i) {
    const auto shade = static_cast<std::uint8_t>(i);
    grey.data.get()[i] = {shade, shade, shade, 255};
  }
  const Photo photo = open(save(grey, "PNG", {}, {.colour = ColourDetail::none}));
  EXPECT_EQ(photo.facts.channels, 1);
  expectSamePixels(*photo.image, grey);
}

TEST(PngFormat, TakesTheLongestThinPicturesAndRefusesThoseWithoutPixels) {
  for (const auto& [width, height] : {std::pair{65500u, 1u}, {1u, 65500u}}) {
    const Image<RGBA8Pixel> picture = test_support::noisePicture(width, height, 3);
    expectSamePixels(*open(save(picture, "PNG")).image, picture);
  }
  EXPECT_THROW(save(Image<RGBA8Pixel>(0, 5), "PNG"), PhotoError);
  EXPECT_THROW(save(Image<RGBA8Pixel>(5, 0), "PNG"), PhotoError);
}

TEST(PngFormat, ReadsEveryKindAndInterlacedOnesAlike) {
  const int grey = PNG_COLOR_TYPE_GRAY, greyAlpha = PNG_COLOR_TYPE_GRAY_ALPHA;
  const int palette = PNG_COLOR_TYPE_PALETTE, alpha = PNG_COLOR_TYPE_RGB_ALPHA;
  for (const Recipe& kind :
       {Recipe{grey, 1}, Recipe{grey, 4}, Recipe{grey, 8}, Recipe{grey, 16}, Recipe{greyAlpha, 8},
        Recipe{palette, 4}, Recipe{PNG_COLOR_TYPE_RGB, 8}, Recipe{PNG_COLOR_TYPE_RGB, 16},
        Recipe{alpha, 8}, Recipe{alpha, 16}}) {
    Recipe interlaced = kind;
    interlaced.interlaced = true;
    const Photo photo = open(makePng(kind));
    const Photo same = open(makePng(interlaced));
    expectSamePixels(*photo.image, *same.image);
    EXPECT_TRUE(same.facts.progressive);
    EXPECT_EQ(photo.facts.notices.size(), kind.depth == 16 ? 1u : 0u);
    // By rows, however many at a time.
    for (const bool isInterlaced : {false, true}) {
      const Bytes file = makePng(isInterlaced ? interlaced : kind);
      const auto reader = openRows(file);
      Image<RGBA8Pixel> byRows(13, 11);
      for (const auto& [first, count] : {std::pair{0u, 1u}, {1u, 7u}, {8u, 3u}})
        reader->read(byRows.row(first), count);
      expectSamePixels(byRows, *photo.image);
    }
  }
}

TEST(PngFormat, TurnsSamplesIntoBytesAsTheyAre) {
  const Bytes samples = samplesOf(13 * 11 * 8);
  const Photo grey = open(makePng({PNG_COLOR_TYPE_GRAY, 8}));
  const Photo colour = open(makePng({PNG_COLOR_TYPE_RGB, 8}));
  const Photo deep = open(makePng({PNG_COLOR_TYPE_RGB_ALPHA, 16}));
  for (std::size_t i = 0; i < 13 * 11; ++i) {
    const RGBA8Pixel g = grey.image->data.get()[i], c = colour.image->data.get()[i];
    ASSERT_TRUE(g.r == samples[i] && g.g == samples[i] && g.b == samples[i] && g.a == 255);
    ASSERT_TRUE(c.r == samples[3 * i] && c.g == samples[3 * i + 1] && c.b == samples[3 * i + 2]);
    // To the nearest of 256 steps.
    const unsigned sample = samples[8 * i] * 256u + samples[8 * i + 1];
    ASSERT_EQ(deep.image->data.get()[i].r, (sample * 255 + 32767) / 65535);
  }
  const Photo keyed = open(makePng({PNG_COLOR_TYPE_PALETTE, 4, false, 13, 11, {}, true}));
  EXPECT_TRUE(keyed.facts.hasAlpha);
  EXPECT_EQ(keyed.image->data.get()[0].a, 10);  // the first entry's
}

TEST(PngFormat, KeepsTextsProfileAndExif) {
  const Bytes text = bytesOf(std::string_view("Title\0A day", 11));
  const Bytes stamped = bytesOf("12345");
  const Photo photo = open(makePng({.chunks = {{"tEXt", text},
                                               {"pHYs", {0, 0, 11, 19, 0, 0, 11, 19, 1}},
                                               {"eXIf", exifOf(6)},
                                               {"tIME", {7, 232, 1, 1, 0, 0, 0}}}}));
  EXPECT_EQ(photo.facts.orientation, 6);
  EXPECT_EQ(photo.image->width, 11u);  // upright
  EXPECT_EQ(photo.image->height, 13u);
  Metadata metadata = photo.metadata;
  Bytes profile(100'000);  // more than one segment
  for (std::size_t i = 0; i < profile.size(); ++i) profile[i] = static_cast<std::uint8_t>(i * i);

  for (const char* format : {"PNG", "JPEG"}) {
    std::vector<Loss> lost;
    const Bytes file = save(*photo.image, format, metadata, {}, &lost);
    const Photo again = open(file);
    EXPECT_EQ(again.facts.orientation, 1);
    EXPECT_EQ(again.image->width, 11u);
    EXPECT_EQ(lost.size(), std::string(format) == "PNG" ? 0u : 1u);
    const std::string content(file.begin(), file.end());
    EXPECT_THAT(content, HasSubstr(format == std::string("PNG") ? "eXIf" : "Exif"));
    if (std::string(format) == "JPEG") continue;
    ASSERT_EQ(again.metadata.chunks.size(), 2u);
    EXPECT_EQ(again.metadata.chunks[0].data, text);
    EXPECT_EQ(again.metadata.chunks[1].type, "pHYs");
  }
}

TEST(PngFormat, CarriesColourProfilesFromAndToJpeg) {
  // Two segments of a profile, as a JPEG file has them.
  Metadata metadata;
  Bytes whole;
  for (std::uint8_t part = 1; part <= 2; ++part) {
    MetadataSegment segment{0xE2, bytesOf(std::string_view("ICC_PROFILE\0", 12))};
    segment.payload.push_back(part);
    segment.payload.push_back(2);
    for (int i = 0; i < (part == 1 ? 65519 : 3000); ++i) {
      const auto byte = static_cast<std::uint8_t>(i * part);
      segment.payload.push_back(byte);
      whole.push_back(byte);
    }
    metadata.segments.push_back(segment);
  }
  const Image<RGBA8Pixel> picture = test_support::noisePicture(8, 8, 1);
  const Photo photo = open(save(picture, "PNG", metadata));
  ASSERT_EQ(photo.metadata.segments.size(), 2u);
  EXPECT_EQ(photo.metadata.segments[0].payload, metadata.segments[0].payload);
  EXPECT_EQ(photo.metadata.segments[1].payload, metadata.segments[1].payload);
  const Photo jpeg = open(save(picture, "JPEG", photo.metadata));
  EXPECT_EQ(jpeg.metadata.segments.back().payload, metadata.segments[1].payload);
}

TEST(PngFormat, FailsWhenCutAtAnyByte) {
  for (const bool interlaced : {false, true}) {
    const Bytes file = makePng({.interlaced = interlaced, .chunks = {{"tEXt", bytesOf("a\0b")}}});
    for (std::size_t length = 1; length < file.size(); ++length) {
      EXPECT_NE(errorOf({file.begin(), file.begin() + static_cast<std::ptrdiff_t>(length)}), "")
          << length;
    }
  }
  PhotoError::Kind kind{};
  Bytes cut = makePng({});
  cut.resize(cut.size() - 20);
  EXPECT_THAT(errorOf(cut, &kind), HasSubstr("truncated"));
  EXPECT_EQ(kind, PhotoError::Kind::truncated);
}

TEST(PngFormat, FailsWhenAnyBitIsFlipped) {
  const Bytes file = makePng({.chunks = {{"tEXt", bytesOf("words")}, {"eXIf", exifOf(3)}}});
  for (std::size_t at = 8; at < file.size(); ++at) {
    Bytes damaged = file;
    damaged[at] ^= 0x10;
    // A changed letter of a chunk's name makes it another chunk, whose checksum is wrong as well.
    EXPECT_NE(errorOf(damaged), "") << at;
  }
}

TEST(PngFormat, ChecksTheSizeBeforeItAllocates) {
  Bytes file = makePng({});
  PhotoError::Kind kind{};
  try {
    open(file, {.limits = {.pixels = 13 * 11 - 1}});
  } catch (const PhotoError& error) {
    kind = error.kind();
    EXPECT_THAT(error.what(), HasSubstr("too large: 13 x 11 pixels"));
  }
  EXPECT_EQ(kind, PhotoError::Kind::tooLarge);
}

// A file of almost no picture data, whatever its header says.
Bytes headerOf(std::uint32_t width, std::uint32_t height, int colourType, int depth) {
  const Recipe recipe = {.colourType = colourType, .depth = depth, .width = 1, .height = 1};
  Bytes file = makePng(recipe);
  const std::size_t sides = 16, typeAndData = 12, length = 17, checksum = 29;
  for (int i = 0; i < 4; ++i) {
    file[sides + i] = static_cast<std::uint8_t>(width >> (24 - 8 * i));
    file[sides + 4 + i] = static_cast<std::uint8_t>(height >> (24 - 8 * i));
  }
  const uLong sum = crc32(0, file.data() + typeAndData, length);
  for (int i = 0; i < 4; ++i) file[checksum + i] = static_cast<std::uint8_t>(sum >> (24 - 8 * i));
  return file;
}

TEST(PngFormat, IsTruncatedWhereItsBytesCannotBecomeThePicture) {
  const Bytes file = headerOf(16000, 16000, PNG_COLOR_TYPE_RGB, 8);
  try {
    pngFormat.reader(file, {});  // reads no row
    FAIL();
  } catch (const PhotoError& error) {
    EXPECT_EQ(error.kind(), PhotoError::Kind::truncated);
  }
  // As many bytes as the best compression leaves of it.
  Bytes longer = headerOf(16000, 16000, PNG_COLOR_TYPE_RGB, 8);
  longer.resize(std::size_t{16000} * 16000 * 3 / 1032);
  EXPECT_NO_THROW(pngFormat.reader(longer, {.limits = {.compressedPixels = 256'000'000}}));
}

TEST(PngFormat, OfFewBytesIsRefusedForManyPixels) {
  const Bytes file =
      makePng({.colourType = PNG_COLOR_TYPE_GRAY, .depth = 1, .width = 2000, .height = 2000});
  const std::uint64_t beyond = 2000 * 2000 - 128 * file.size();
  ASSERT_LT(beyond, 2000 * 2000);
  EXPECT_NO_THROW(pngFormat.reader(file, {.limits = {.compressedPixels = beyond}}));
  try {
    pngFormat.reader(file, {.limits = {.compressedPixels = beyond - 1}});
    FAIL();
  } catch (const PhotoError& error) {
    EXPECT_EQ(error.kind(), PhotoError::Kind::tooLarge);
    EXPECT_THAT(error.what(), HasSubstr("too large: 2000 x 2000 pixels in a file of this size"));
  }
}

TEST(PngFormat, Of64KilobytesTakesLessThan256MebibytesForItsPixels) {
  constexpr std::uint64_t most = 65536 * 128 + DecodeLimits{}.compressedPixels;
  EXPECT_LT(most * sizeof(RGBA8Pixel), std::uint64_t{256} << 20);
  Bytes file = headerOf(most / 4096 + 1, 4096, PNG_COLOR_TYPE_GRAY, 1);
  file.resize(65536);
  EXPECT_THROW(pngFormat.reader(file, {}), PhotoError);
}

TEST(PngFormat, IsScaledByAveragesOfBlocks) {
  const Image<RGBA8Pixel> picture = opaque(test_support::noisePicture(13, 11, 5));
  const Bytes file = save(picture, "PNG");
  for (const int scale : {2, 4, 8}) {
    const Photo photo = open(file, {.scale = scale});
    ASSERT_EQ(photo.image->width, (13u + scale - 1) / scale);
    ASSERT_EQ(photo.image->height, (11u + scale - 1) / scale);
    unsigned sum = 0;
    for (int y = 0; y < scale; ++y)
      for (int x = 0; x < scale; ++x) sum += picture.row(y)[x].g;
    const unsigned count = scale * scale;
    EXPECT_EQ(photo.image->row(0)[0].g, (sum + count / 2) / count);
    EXPECT_EQ(photo.image->row(0)[0].a, 255);
  }
}

TEST(PngFormat, StopsWhenAsked) {
  std::stop_source stop;
  stop.request_stop();
  const Bytes file = makePng({});
  EXPECT_THROW(open(file, {.stop = stop.get_token()}), Stopped);
  const auto reader = pngFormat.reader(file, {.stop = stop.get_token()});
  Image<RGBA8Pixel> picture(13, 11);
  EXPECT_THROW(reader->read(picture.data.get(), 11), Stopped);
}

}  // namespace
}  // namespace pelorin::photo
