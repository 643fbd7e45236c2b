#pragma once

#include <cmath>
#include <cstdint>
#include <optional>
#include <string>

namespace pelorin::photo {

/// Where a photo's time comes from.
enum class TimeSource { none, camera, file };

/// What is reported of a photo; its shot stands at the same place of a list of its own.
struct ScannedPhoto {
  std::string path;             ///< How the caller calls it.
  std::uint32_t width, height;  ///< As stored in the file.
  int orientation;
  std::optional<std::uint64_t> bytes;  ///< Size of the file; none without a file.
  TimeSource timeSource;
  std::string time;  ///< For reading; empty where there is none.
  /// How natural the full-size picture looks, lower is better; NaN when it is too small to tell and
  /// none where it was not needed or could not be had.
  std::optional<float> niqe = std::nullopt;
  /// When the file was last changed, as `FileStamp` has it; none without a file.
  std::optional<std::int64_t> modified = std::nullopt;
  bool isReference = false;  ///< Never suggested for removal.

  std::uint64_t pixels() const { return std::uint64_t{width} * height; }
  bool isScored() const { return niqe && !std::isnan(*niqe); }
};

/// A photo that could not be read.
struct FailedPhoto {
  std::string path;
  std::string reason;
};

}  // namespace pelorin::photo
