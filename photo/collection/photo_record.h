#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <stop_token>
#include <string>

#include "image_processing/dupe/packed_cdf.h"
#include "photo/collection/shot.h"
#include "photo/decode_limits.h"
#include "photo/metadata/capture_time.h"

namespace pelorin::photo {

/// What a photo is reduced to, and what the cache keeps of it.
struct PhotoRecord {
  std::uint32_t width, height;  ///< As stored in the file.
  int orientation;              ///< EXIF, 1 ... 8.
  std::optional<CaptureTime> captureTime;
  image_processing::PackedCDF cdf;
};

/// By what a photo's pixels are divided before they are counted: 1, 2, 4 or 8, or `automaticScale`.
constexpr int automaticScale = 0;

/// The largest divisor of the decoder that leaves the distribution enough pixels, 8 from about four
/// megapixels on.
int scaleFor(std::uint32_t width, std::uint32_t height);

/// How many pixels of a photo are counted at `scale`, one of those above.
std::uint64_t countedPixels(std::uint32_t width, std::uint32_t height, int scale);

/// Decodes a photo once; its pixels are counted as they are stored, not turned.
/// @throws PhotoError as `open`, Stopped when `stop` says so.
PhotoRecord readPhotoRecord(std::span<const std::uint8_t> file, int scale = automaticScale,
                            std::stop_token stop = {}, const DecodeLimits& limits = {});

/// What tells a changed file from the one that was read.
struct FileStamp {
  std::uint64_t bytes;
  std::int64_t modified;  ///< Nanoseconds since 1970 in UTC.

  friend bool operator==(const FileStamp&, const FileStamp&) = default;
};

/// Empty for what is no regular file that can be looked at.
std::optional<FileStamp> stampOf(const std::string& path);

/// The moment a file was last changed; its wall clock is this machine's.
ShotTime fileTime(const FileStamp& stamp);

/// The moment a camera stated.
ShotTime shotTime(const CaptureTime& time);

}  // namespace pelorin::photo
