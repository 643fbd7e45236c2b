#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "photo/jpeg/jpeg_codec.h"
#include "photo/jpeg/libjpeg_errors.h"
#include "tests/support/bytes.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {

/// A picture as a JPEG file.
Bytes jpegOf(const Image<RGBA8Pixel>& picture,
             const std::vector<photo::MetadataSegment>& metadata = {}, int quality = 90);

/// A small photo-like JPEG file.
Bytes smallJpeg(std::uint64_t seed = 1);

/// The pixels of a JPEG file, as stored.
Image<RGBA8Pixel> decoded(const Bytes& file);

/// A file as other programs may write it; the defaults are a plain colour photo.
struct JpegRecipe {
  std::uint32_t width = 32, height = 24;
  J_COLOR_SPACE samples = JCS_RGB;   ///< Of the pixels: JCS_GRAYSCALE, JCS_RGB or JCS_CMYK.
  J_COLOR_SPACE stored = JCS_YCbCr;  ///< In the file.
  int horizontalSampling = 2, verticalSampling = 2;  ///< Of the first channel, others have 1.
  int quality = 90;
  int restartInterval = 0;
  bool arithmetic = false;
  std::optional<bool> adobe = {};  ///< Adobe segment; libjpeg's choice when not set.
  std::vector<jpeg_scan_info> scans = {};
  std::vector<photo::MetadataSegment> metadata = {};
  Bytes profile = {};  ///< Written in ICC segments of at most 65519 bytes.
};

/// @param pixels  rows back to back, as many bytes a pixel as `recipe.samples` has.
Bytes makeJpeg(const JpegRecipe& recipe, const Bytes& pixels);

/// A file of a photo-like picture; CMYK gets the inverse of the picture and some black.
Bytes makeJpeg(const JpegRecipe& recipe);

/// A progressive script that stores everything: DC of all channels, then AC of each.
std::vector<jpeg_scan_info> completeProgressiveScans(int channels = 3);

/// A progressive script of `count` scans, at most 568, for three channels: DC, then single
/// coefficients, each in three steps of precision. Below 568 it stores less than there was.
std::vector<jpeg_scan_info> progressiveScans(int count);

/// Three scans of one whole channel each.
std::vector<jpeg_scan_info> channelScans();

/// A script for one channel of 505 scans, each the refinement of one coefficient by one bit.
std::vector<jpeg_scan_info> greyScansBitByBit();

/// Where a segment's marker code begins (its 0xFF); `nth` counts from 0.
std::size_t findSegment(const Bytes& file, std::uint8_t marker, int nth = 0);

/// A file whose frame header claims another size.
Bytes withSize(Bytes file, std::uint32_t width, std::uint32_t height);

/// A file with a byte of its frame header changed: 0 and 1 length, 2 precision, 7 channel count.
Bytes withFrameByte(Bytes file, std::size_t offset, std::uint8_t value);

/// What went wrong, or "" when nothing did.
template <typename Action>
std::string jpegErrorOf(const Action& action) {
  try {
    action();
  } catch (const photo::PhotoError& error) {
    return error.what();
  }
  return "";
}

/// Mean absolute difference of red, green and blue over two pictures of one size.
double meanDifference(const std::uint8_t* a, const std::uint8_t* b, std::size_t pixels);

Bytes rgbaBytes(const photo::DecodedPicture& picture);

}  // namespace pelorin::test_support
