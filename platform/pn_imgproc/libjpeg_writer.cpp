#include "platform/pn_imgproc/libjpeg_writer.h"

#include <jerror.h>

#include <algorithm>
#include <exception>

namespace pelorin::imgproc {

LibjpegWriter::LibjpegWriter(std::size_t firstSize) : destination_{{}, {}, firstSize} {
  codec_.err = errors_.manager();
  try {
    run([this] { jpeg_create_compress(&codec_); });
  } catch (...) {
    jpeg_destroy_compress(&codec_);  // half of it may be there
    throw;
  }
  destination_.base.init_destination = begin;
  destination_.base.empty_output_buffer = makeRoom;
  destination_.base.term_destination = end;
  codec_.dest = &destination_.base;
}

void LibjpegWriter::copySegments(const jpeg_decompress_struct& source) {
  for (auto segment = source.marker_list; segment != nullptr; segment = segment->next)
    jpeg_write_marker(&codec_, segment->marker, segment->data, segment->data_length);
}

bool LibjpegWriter::grow(Destination& destination) {
  const std::size_t used = destination.bytes.size();
  try {
    destination.bytes.resize(std::max(destination.firstSize, used * 2));
  } catch (const std::exception&) {  // bad_alloc or length_error; neither may cross libjpeg
    return false;
  }
  destination.base.next_output_byte = destination.bytes.data() + used;
  destination.base.free_in_buffer = destination.bytes.size() - used;
  return true;
}

void LibjpegWriter::begin(j_compress_ptr codec) {
  if (!grow(*reinterpret_cast<Destination*>(codec->dest))) ERREXIT1(codec, JERR_OUT_OF_MEMORY, 0);
}

boolean LibjpegWriter::makeRoom(j_compress_ptr codec) {
  begin(codec);
  return TRUE;
}

void LibjpegWriter::end(j_compress_ptr codec) {
  auto& destination = *reinterpret_cast<Destination*>(codec->dest);
  destination.bytes.resize(destination.bytes.size() - destination.base.free_in_buffer);
}

}  // namespace pelorin::imgproc
