#pragma once

#include <cstddef>
#include <cstdint>
#include <utility>
#include <vector>

#include "platform/pn_imgproc/libjpeg_errors.h"

namespace pelorin::imgproc {

/// A libjpeg compressor into a vector, and what its errors become.
class LibjpegWriter {
 public:
  /// @param firstSize  how many bytes to make room for at first; doubled when they are used up.
  explicit LibjpegWriter(std::size_t firstSize);
  ~LibjpegWriter() { jpeg_destroy_compress(&codec_); }
  LibjpegWriter(const LibjpegWriter&) = delete;
  LibjpegWriter& operator=(const LibjpegWriter&) = delete;

  jpeg_compress_struct& codec() { return codec_; }

  /// As LibjpegErrors::run.
  template <typename Body>
  void run(const Body& body) {
    errors_.run(body);
  }

  /// Writes the segments that a reader kept, JFIF and Adobe among them: libjpeg's own must be off.
  /// Within `run`, before the picture data.
  void copySegments(const jpeg_decompress_struct& source);

  /// What was written, once libjpeg has finished; empty afterwards.
  std::vector<std::uint8_t> takeFile() { return std::move(destination_.bytes); }

 private:
  struct Destination {
    jpeg_destination_mgr base;  // first, so that libjpeg's pointer to it is one to the whole
    std::vector<std::uint8_t> bytes;
    std::size_t firstSize;
  };

  static bool grow(Destination& destination);
  static void begin(j_compress_ptr codec);
  static boolean makeRoom(j_compress_ptr codec);
  static void end(j_compress_ptr codec);

  LibjpegErrors errors_;
  jpeg_compress_struct codec_ = {};
  Destination destination_;
};

}  // namespace pelorin::imgproc
