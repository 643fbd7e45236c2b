#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <functional>
#include <memory>
#include <span>
#include <vector>

#include "photo/decode_limits.h"          // IWYU pragma: export
#include "photo/jpeg/jpeg_coding.h"       // IWYU pragma: export
#include "photo/jpeg/metadata_segment.h"  // IWYU pragma: export
#include "photo/photo_error.h"            // IWYU pragma: export

namespace pelorin::photo {

// JPEG files as plain C++: whole files in memory in, whole files in memory out. Nothing here keeps
// state, so any thread may call; std::bad_alloc passes through everywhere.

/// What a JPEG file says before its picture data.
struct JpegHeader {
  std::uint32_t width, height;
  /// 1 grey, 3 colour, 4 CMYK or YCCK. An ICC profile among `metadata` (APP2 "ICC_PROFILE") is one
  /// for that many channels: with 1 and 4 it does not describe decoded pixels and must not be
  /// written with them.
  int components;
  JpegCoding coding;
  /// In file order. Adobe segments are left out: they tell a decoder how this file is coded.
  std::vector<MetadataSegment> metadata;
};

/// RGBA pixels, rows back to back, alpha 255; released with `free`.
struct DecodedPicture {
  struct Free {
    void operator()(std::uint8_t* bytes) const { std::free(bytes); }
  };
  std::unique_ptr<std::uint8_t, Free> pixels;
  std::uint32_t width, height;
};

/// @throws PhotoError when the bytes are no JPEG file or end within the header.
JpegHeader readJpegHeader(std::span<const std::uint8_t> file);

/// Decodes to RGBA, grey and CMYK/YCCK included. CMYK becomes sRGB through the profile in the file
/// where there is a usable one, otherwise each channel is the light that ink and black let through.
/// @param scale  1 or less is full size, otherwise the divisor, rounded down to a power of two, at
///               most 8; sizes are rounded up.
/// @throws PhotoError when the file is damaged, truncated, of an unsupported kind (lossless, more
///         than 8 bits, two or five channels) or beyond the limits: there is no half-grey picture.
///         What a file holds after its end mark is no concern, and neither are stray bytes between
///         complete scans.
DecodedPicture decodeJpeg(std::span<const std::uint8_t> file, int scale = 1,
                          const DecodeLimits& limits = {});

/// As `decodeJpeg`, into memory of the caller's own.
/// @param makeRoom  called once, with the decoded width and height, for the place of that many RGBA
///                  pixels. What it throws passes through.
void decodeJpegInto(
    const std::function<std::uint8_t*(std::uint32_t width, std::uint32_t height)>& makeRoom,
    std::span<const std::uint8_t> file, int scale = 1, const DecodeLimits& limits = {});

/// How many samples of colour a file has: as many as of brightness, or half as many each way.
enum class Chroma { whole, halved };

/// Encodes RGBA pixels (alpha is ignored) as a baseline file with the standard Huffman tables:
/// tables of its own would save a few percent and more than double the time.
/// @param quality   1 ... 100; what lies outside counts as the nearer end.
/// @param metadata  written as it is, in this order. A JFIF segment is added in front when it has
///                  neither a JFIF nor an Exif one.
/// @throws PhotoError when a side is 0 or above 65500, or a segment is over 65533 bytes or neither
///         APPn nor COM.
std::vector<std::uint8_t> encodeJpeg(const std::uint8_t* rgba, std::uint32_t width,
                                     std::uint32_t height, int quality,
                                     std::span<const MetadataSegment> metadata = {},
                                     Chroma chroma = Chroma::halved);

/// Turns a JPEG file clockwise without decoding its blocks. Partial blocks that cannot be moved are
/// trimmed from the edge; where that would leave nothing, the picture is decoded and encoded again
/// at quality 100. A progressive file stays one. APPn and COM segments are kept byte for byte.
/// @param degrees  a multiple of 90, taken modulo 360; 0 gives the bytes of `file`.
/// @throws PhotoError for other angles and for what decodeJpeg refuses.
std::vector<std::uint8_t> rotateJpeg(std::span<const std::uint8_t> file, int degrees,
                                     const DecodeLimits& limits = {});

}  // namespace pelorin::photo
