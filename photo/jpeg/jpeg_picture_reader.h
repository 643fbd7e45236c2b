#pragma once

#include <cstdint>
#include <optional>

#include "photo/jpeg/cmyk_to_rgba.h"
#include "photo/jpeg/jpeg_codec.h"
#include "photo/jpeg/libjpeg_reader.h"

namespace pelorin::photo {

/// The picture of a JPEG file, as rows of RGBA from top to bottom.
class JpegPictureReader {
 public:
  enum class Keep { profile, everySegment };

  /// Reads the header and checks it against the limits; nothing of the picture's size is allocated.
  /// @param file   outlives this; as for `LibjpegReader`.
  /// @param scale  as for `decodeJpeg`.
  JpegPictureReader(const FileView& file, int scale, const DecodeLimits& limits, Keep keep);

  /// With the segments that were kept.
  JpegHeader header() const;
  std::uint32_t width();   ///< Decoded.
  std::uint32_t height();  ///< Decoded.

  /// The next `count` rows, back to back; with the last the whole file is checked.
  /// @throws PhotoError as `decodeJpeg`.
  void read(std::uint8_t* rows, std::uint32_t count);

 private:
  void begin();
  void end();

  LibjpegReader reader_;
  std::optional<CmykToRgba> fromCmyk_;
  bool begun_ = false;
};

/// What a reader that has read the header knows.
JpegHeader headerOf(const jpeg_decompress_struct& codec);

}  // namespace pelorin::photo
