#pragma once

#include <cstddef>
#include <cstdint>
#include <exception>
#include <memory>
#include <utility>
#include <vector>

#include "photo/file_view.h"
#include "photo/jpeg/libjpeg_errors.h"

namespace pelorin::photo {

/// A libjpeg compressor into a vector, and what its errors become.
class LibjpegWriter {
 public:
  /// @param expectedSize  how many bytes to make room for; more cost a copy of them.
  /// @param overflow      takes what is behind the first 8 MiB; null for none.
  explicit LibjpegWriter(std::size_t expectedSize, ByteStore* overflow = nullptr);
  ~LibjpegWriter() { jpeg_destroy_compress(&codec_); }
  LibjpegWriter(const LibjpegWriter&) = delete;
  LibjpegWriter& operator=(const LibjpegWriter&) = delete;

  jpeg_compress_struct& codec() { return codec_; }

  /// As LibjpegErrors::run; it also throws what the overflow throws.
  template <typename Body>
  void run(const Body& body) {
    try {
      errors_.run(body);
    } catch (...) {
      if (destination_.failure != nullptr) std::rethrow_exception(destination_.failure);
      throw;
    }
  }

  /// Writes the segments that a reader kept, JFIF and Adobe among them: libjpeg's own must be off.
  /// Within `run`, before the picture data.
  void copySegments(const jpeg_decompress_struct& source);

  /// What was written, once libjpeg has finished; empty afterwards.
  std::vector<std::uint8_t> takeFile() { return std::move(destination_.bytes); }

 private:
  static constexpr std::size_t blockSize = 65536, mostInMemory = std::size_t{8} << 20;

  // Filled block by block: a vector made large enough for libjpeg to write into would be cleared.
  struct Destination {
    jpeg_destination_mgr base;  // first, so that libjpeg's pointer to it is one to the whole
    std::vector<std::uint8_t> bytes;
    ByteStore* overflow = nullptr;
    std::exception_ptr failure;  // which cannot cross libjpeg
    // Not within, since the stacks of callers may be small.
    std::unique_ptr<std::uint8_t[]> block{new std::uint8_t[blockSize]};
  };

  static Destination& destinationOf(j_compress_ptr codec);
  static void append(j_compress_ptr codec, std::size_t count);
  static void begin(j_compress_ptr codec);
  static boolean empty(j_compress_ptr codec);
  static void end(j_compress_ptr codec);

  LibjpegErrors errors_;
  jpeg_compress_struct codec_ = {};
  Destination destination_;
};

}  // namespace pelorin::photo
