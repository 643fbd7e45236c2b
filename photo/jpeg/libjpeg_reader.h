#pragma once

#include <cstdint>
#include <span>

#include "photo/decode_limits.h"
#include "photo/jpeg/libjpeg_errors.h"

namespace pelorin::photo {

/// A libjpeg decompressor over a file in memory, and what its errors become.
class LibjpegReader {
 public:
  /// @param file  outlives this.
  explicit LibjpegReader(std::span<const std::uint8_t> file);
  ~LibjpegReader() { jpeg_destroy_decompress(&codec_); }
  LibjpegReader(const LibjpegReader&) = delete;
  LibjpegReader& operator=(const LibjpegReader&) = delete;

  jpeg_decompress_struct& codec() { return codec_; }
  const jpeg_decompress_struct& codec() const { return codec_; }

  /// As LibjpegErrors::run.
  template <typename Body>
  void run(const Body& body) {
    errors_.run(body);
  }

  /// Keeps the segments of `marker` in the codec's `marker_list`; before readHeader.
  void keepSegments(int marker);

  /// Keeps every APPn and COM segment; before readHeader.
  void keepAllSegments();

  /// Keeps none of those that stand between and behind the picture data; after readHeader.
  void keepNoMoreSegments();

  /// Reads up to the picture data.
  /// @throws PhotoError also for more segments than that, which cost libjpeg the square of
  ///         their number.
  void readHeader(int mostSegments = DecodeLimits{}.segments);

  /// After the picture data. A file of several scans may end, without a warning, before each
  /// channel had one.
  /// @throws PhotoError when a channel is missing.
  void checkEveryChannelCame() const;

 private:
  std::span<const std::uint8_t> file_;
  LibjpegErrors errors_;
  jpeg_decompress_struct codec_ = {};
};

}  // namespace pelorin::photo
