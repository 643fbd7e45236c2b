#include "photo/jpeg/libjpeg_reader.h"

#include <jerror.h>

#include <algorithm>
#include <string>

#include "photo/jpeg/jpeg_codec.h"
#include "photo/jpeg/jpeg_end.h"

namespace pelorin::photo {

LibjpegReader::LibjpegReader(const FileView& file) : file_(file) {
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
  if (hasMoreSegments(file_.bytes, static_cast<std::size_t>(std::max(mostSegments, 0)))) {
    throw PhotoError(PhotoError::Kind::tooLarge,
                     "too many segments: at most " + std::to_string(mostSegments) + " can be read");
  }
  if (file_.rest != nullptr) beginWithRest();
  run([this] {
    if (file_.rest == nullptr) jpeg_mem_src(&codec_, file_.bytes.data(), file_.bytes.size());
    jpeg_read_header(&codec_, TRUE);
  });
}

std::uint64_t LibjpegReader::bytesElsewhere() const {
  return file_.rest != nullptr ? file_.rest->size() - rest_.next : 0;
}

void LibjpegReader::beginWithRest() {
  rest_.base.init_source = [](j_decompress_ptr) {};
  rest_.base.fill_input_buffer = fill;
  rest_.base.skip_input_data = skip;
  rest_.base.resync_to_restart = jpeg_resync_to_restart;
  rest_.base.term_source = [](j_decompress_ptr) {};
  rest_.base.next_input_byte = file_.bytes.data();
  rest_.base.bytes_in_buffer = file_.bytes.size();
  rest_.source = file_.rest;
  rest_.block.reset(new std::uint8_t[blockSize]);
  codec_.src = &rest_.base;
}

LibjpegReader::Rest& LibjpegReader::restOf(j_decompress_ptr codec) {
  return *reinterpret_cast<Rest*>(codec->src);
}

boolean LibjpegReader::fill(j_decompress_ptr codec) {
  static constexpr JOCTET endMark[] = {0xFF, JPEG_EOI};  // as libjpeg has it in memory
  Rest& rest = restOf(codec);
  const std::uint64_t left = rest.source->size() - rest.next;
  if (left == 0) {
    WARNMS(codec, JWRN_JPEG_EOF);
    rest.base.next_input_byte = endMark;
    rest.base.bytes_in_buffer = sizeof endMark;
    return TRUE;
  }
  const auto count = static_cast<std::size_t>(std::min<std::uint64_t>(left, blockSize));
  try {
    rest.source->read(rest.next, {rest.block.get(), count});
  } catch (...) {
    rest.failure = std::current_exception();
  }
  if (rest.failure != nullptr) ERREXIT(codec, JERR_FILE_READ);
  rest.next += count;
  rest.base.next_input_byte = rest.block.get();
  rest.base.bytes_in_buffer = count;
  return TRUE;
}

void LibjpegReader::skip(j_decompress_ptr codec, long count) {
  if (count <= 0) return;
  jpeg_source_mgr& source = *codec->src;
  auto left = static_cast<std::size_t>(count);
  while (left > source.bytes_in_buffer) {
    left -= source.bytes_in_buffer;
    fill(codec);
  }
  source.next_input_byte += left;
  source.bytes_in_buffer -= left;
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
