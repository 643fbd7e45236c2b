#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <memory>
#include <span>
#include <stdexcept>
#include <string>
#include <vector>

namespace pelorin::imgproc {

// JPEG files as plain C++: whole files in memory in, whole files in memory out. Nothing here keeps
// state, so any thread may call; std::bad_alloc passes through everywhere.

/// Why a JPEG file could not be read or made; `what()` is one clause for a user, without the file's
/// name: "truncated: the picture data ends early".
class JpegError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

/// One APPn or COM segment: `marker` 0xE0 ... 0xEF or 0xFE, `payload` what follows its length.
struct MetadataSegment {
  std::uint8_t marker;
  std::vector<std::uint8_t> payload;
};

/// What a JPEG file says before its picture data.
struct JpegHeader {
  std::uint32_t width, height;
  int components;  ///< 1 grey, 3 colour, 4 CMYK or YCCK.
  bool progressive;
  std::vector<MetadataSegment> metadata;  ///< In file order; JFIF and Adobe segments left out.
};

struct DecodeLimits {
  std::uint64_t pixels = 268'435'456;  ///< Checked against the header before anything is allocated.
  int progressiveScans = 100;
};

/// RGBA pixels, rows back to back, alpha 255; released with `free`.
struct DecodedPicture {
  struct Free {
    void operator()(std::uint8_t* pixels) const { std::free(pixels); }
  };
  std::unique_ptr<std::uint8_t, Free> pixels;
  std::uint32_t width, height;
};

/// @throws JpegError when the bytes are no JPEG file or end within the header.
JpegHeader readJpegHeader(std::span<const std::uint8_t> file);

/// Decodes to RGBA, grey and CMYK/YCCK included.
/// @param scale  1 or less is full size, otherwise the divisor, rounded down to a power of two, at
///               most 8.
/// @throws JpegError when the file is damaged, truncated or beyond the limits: there is no
///         half-grey picture.
DecodedPicture decodeJpeg(std::span<const std::uint8_t> file, int scale = 1,
                          const DecodeLimits& limits = {});

/// Encodes RGBA pixels (alpha is ignored), 4:2:0 baseline with optimised tables, `metadata` written
/// as it is.
/// @param quality  1 ... 100.
/// @throws JpegError when a side is 0 or above 65500 or a segment is over 65533 bytes.
std::vector<std::uint8_t> encodeJpeg(const std::uint8_t* rgba, std::uint32_t width,
                                     std::uint32_t height, int quality,
                                     std::span<const MetadataSegment> metadata = {});

/// Turns a JPEG file clockwise without decoding its blocks; partial edge blocks that cannot be
/// moved are trimmed, metadata is kept as it is.
/// @param degrees  a multiple of 90, taken modulo 360.
/// @throws JpegError for other angles and for damaged files.
std::vector<std::uint8_t> rotateJpeg(std::span<const std::uint8_t> file, int degrees,
                                     const DecodeLimits& limits = {});

/// A whole file in memory.
/// @throws std::system_error when it cannot be opened or read (a directory included).
std::vector<std::uint8_t> readFile(const std::string& path);

/// Replaces `path` in one step: writes a temporary in the same folder, then renames it. On failure
/// the old file is untouched and nothing is left behind.
/// @throws std::system_error when it cannot be written.
void writeFileAtomically(const std::string& path, std::span<const std::uint8_t> bytes);

}  // namespace pelorin::imgproc
