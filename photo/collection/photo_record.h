#pragma once

#include <cstdint>
#include <filesystem>
#include <optional>

#include "cli/frame/inputs.h"
#include "image_processing/dupe/green_cdf.h"
#include "photo/collection/shot.h"
#include "photo/metadata/capture_time.h"

namespace pelorin::cli {

/// What a photo is reduced to, and what the cache keeps of it.
struct PhotoRecord {
  std::uint32_t width, height;  ///< As stored in the file.
  int orientation;              ///< EXIF, 1 ... 8.
  std::optional<CaptureTime> captureTime;
  image_processing::GreenCDF cdf;
};

/// By what a photo's pixels are divided before they are counted: 1, 2, 4 or 8, or `automaticScale`.
constexpr int automaticScale = 0;

/// The largest divisor of the decoder that leaves the distribution enough pixels, 8 from about four
/// megapixels on.
int scaleFor(std::uint32_t width, std::uint32_t height);

/// Reads and decodes a photo once.
/// @throws what reading and decoding throw, for `explain`; Interrupted on Ctrl-C.
PhotoRecord readPhotoRecord(const Input& input, int scale);

/// What tells a changed file from the one that was read.
struct FileStamp {
  std::uint64_t bytes;
  std::int64_t modified;  ///< Nanoseconds since 1970 in UTC.

  friend bool operator==(const FileStamp&, const FileStamp&) = default;
};

/// Empty for what is no file that can be looked at, standard input included.
std::optional<FileStamp> stampOf(const Input& input);

/// The moment a file was last changed; its wall clock is this machine's.
ShotTime fileTime(const FileStamp& stamp);

/// The moment a camera stated.
ShotTime shotTime(const CaptureTime& time);

}  // namespace pelorin::cli
