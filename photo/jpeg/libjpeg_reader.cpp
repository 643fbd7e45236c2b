#include "photo/jpeg/libjpeg_reader.h"

#include <algorithm>
#include <string>

#include "photo/jpeg/jpeg_codec.h"
#include "photo/jpeg/jpeg_end.h"

namespace pelorin::photo {

LibjpegReader::LibjpegReader(std::span<const std::uint8_t> file) : file_(file) {
  codec_.err = errors_.manager();
  try {
    run([this] { jpeg_create_decompress(&codec_); });
  } catch (...) {
    jpeg_destroy_decompress(&codec_);  // half of it may be there
    throw;
  }
}

void LibjpegReader::keepSegments(int marker) {
  constexpr unsigned wholeSegment = 0xFFFF;
  run([this, marker] { jpeg_save_markers(&codec_, marker, wholeSegment); });
}

void LibjpegReader::keepNoMoreSegments() {
  run([this] {
    jpeg_save_markers(&codec_, JPEG_COM, 0);
    for (int n = 0; n < 16; ++n) jpeg_save_markers(&codec_, JPEG_APP0 + n, 0);
  });
}

void LibjpegReader::keepAllSegments() {
  keepSegments(JPEG_COM);
  for (int n = 0; n < 16; ++n) keepSegments(JPEG_APP0 + n);
}

void LibjpegReader::readHeader(int mostSegments) {
  // libjpeg goes through those it has for each that it keeps.
  if (hasMoreSegments(file_, static_cast<std::size_t>(std::max(mostSegments, 0)))) {
    throw PhotoError(PhotoError::Kind::tooLarge,
                     "too many segments: at most " + std::to_string(mostSegments) + " can be read");
  }
  run([this] {
    jpeg_mem_src(&codec_, file_.data(), file_.size());
    jpeg_read_header(&codec_, TRUE);
  });
}

void LibjpegReader::checkEveryChannelCame() const {
  for (int i = 0; i < codec_.num_components; ++i) {
    // Set when the channel's first scan begins.
    if (codec_.comp_info[i].quant_table == nullptr) {
      throw PhotoError(PhotoError::Kind::truncated, "truncated: a colour channel is missing");
    }
  }
}

}  // namespace pelorin::photo
