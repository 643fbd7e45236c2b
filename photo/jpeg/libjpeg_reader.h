#pragma once

#include <cstdint>
#include <exception>
#include <memory>

#include "photo/decode_limits.h"
#include "photo/file_view.h"
#include "photo/jpeg/libjpeg_errors.h"

namespace pelorin::photo {

/// A libjpeg decompressor over a file, and what its errors become.
class LibjpegReader {
 public:
  /// @param file  outlives this. With a rest, `beginsPlainJpeg` holds for its first bytes.
  explicit LibjpegReader(const FileView& file);
  ~LibjpegReader() { jpeg_destroy_decompress(&codec_); }
  LibjpegReader(const LibjpegReader&) = delete;
  LibjpegReader& operator=(const LibjpegReader&) = delete;

  jpeg_decompress_struct& codec() { return codec_; }
  const jpeg_decompress_struct& codec() const { return codec_; }

  /// As LibjpegErrors::run; it also throws what reading the file throws.
  template <typename Body>
  void run(const Body& body) {
    try {
      errors_.run(body);
    } catch (...) {
      if (rest_.failure != nullptr) std::rethrow_exception(rest_.failure);
      throw;
    }
  }

  /// How many bytes of the file are not in memory and still to come.
  std::uint64_t bytesElsewhere() const;

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
  static constexpr std::size_t blockSize = 65536;

  // What libjpeg reads a file from that is partly elsewhere.
  struct Rest {
    jpeg_source_mgr base;  // first, so that libjpeg's pointer to it is one to the whole
    ByteSource* source;
    std::uint64_t next;  // place in it
    std::unique_ptr<std::uint8_t[]> block;
    std::exception_ptr failure;  // which cannot cross libjpeg
  };

  void beginWithRest();
  static Rest& restOf(j_decompress_ptr codec);
  static boolean fill(j_decompress_ptr codec);
  static void skip(j_decompress_ptr codec, long count);

  FileView file_;
  Rest rest_ = {};
  LibjpegErrors errors_;
  jpeg_decompress_struct codec_ = {};
};

}  // namespace pelorin::photo
