#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "photo/file_view.h"
#include "photo/jpeg/jpeg_codec.h"
#include "photo/jpeg/libjpeg_writer.h"

namespace pelorin::photo {

/// How a JPEG file is to be made.
struct JpegMaking {
  int quality = 90;  ///< 1 ... 100; what lies outside counts as the nearer end.
  ChromaSampling sampling = {};
  bool progressive = false;
  bool grey = false;  ///< Of one channel.
};

/// A JPEG file that is made of rows, as `encodeJpeg` makes it.
class JpegPictureWriter {
 public:
  /// @param overflow  as in `SaveOptions`.
  JpegPictureWriter(std::uint32_t width, std::uint32_t height, const JpegMaking& making,
                    std::span<const MetadataSegment> metadata, ByteStore* overflow = nullptr);

  /// The next `count` rows, back to back; no more than the picture has. RGBA, or of a grey file a
  /// byte for each pixel.
  void write(const std::uint8_t* pixels, std::uint32_t count);

  /// The file, or what of it is in memory, once, after the last row.
  std::vector<std::uint8_t> finish();

 private:
  LibjpegWriter writer_;
};

/// Puts segments into a file of `JpegPictureWriter` that was made without any: it becomes the file
/// that is made with them.
/// @throws PhotoError as the writer.
void insertSegments(std::vector<std::uint8_t>& file, std::span<const MetadataSegment> segments);

}  // namespace pelorin::photo
