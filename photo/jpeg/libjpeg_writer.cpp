#include "photo/jpeg/libjpeg_writer.h"

#include <jerror.h>

#include <algorithm>
#include <exception>
#include <new>
#include <stdexcept>

namespace pelorin::photo {

LibjpegWriter::LibjpegWriter(std::size_t expectedSize, ByteStore* overflow) {
  destination_.overflow = overflow;
  destination_.bytes.reserve(overflow != nullptr ? std::min(expectedSize, mostInMemory)
                                                 : expectedSize);
  codec_.err = errors_.manager();
  try {
    run([this] { jpeg_create_compress(&codec_); });
  } catch (...) {
    jpeg_destroy_compress(&codec_);  // half of it may be there
    throw;
  }
  destination_.base.init_destination = begin;
  destination_.base.empty_output_buffer = empty;
  destination_.base.term_destination = end;
  codec_.dest = &destination_.base;
}

void LibjpegWriter::copySegments(const jpeg_decompress_struct& source) {
  for (auto segment = source.marker_list; segment != nullptr; segment = segment->next)
    jpeg_write_marker(&codec_, segment->marker, segment->data, segment->data_length);
}

LibjpegWriter::Destination& LibjpegWriter::destinationOf(j_compress_ptr codec) {
  return *reinterpret_cast<Destination*>(codec->dest);
}

void LibjpegWriter::append(j_compress_ptr codec, std::size_t count) {
  Destination& destination = destinationOf(codec);
  const std::uint8_t* const block = destination.block.get();
  try {
    ByteStore* const overflow = destination.overflow;
    if (overflow != nullptr &&
        (overflow->size() > 0 || destination.bytes.size() + count > mostInMemory)) {
      overflow->append({block, count});
    } else {
      destination.bytes.insert(destination.bytes.end(), block, block + count);
    }
  } catch (const std::length_error&) {
    destination.failure = std::make_exception_ptr(std::bad_alloc());
  } catch (...) {
    destination.failure = std::current_exception();
  }
  if (destination.failure != nullptr) ERREXIT1(codec, JERR_OUT_OF_MEMORY, 0);
}

void LibjpegWriter::begin(j_compress_ptr codec) {
  Destination& destination = destinationOf(codec);
  destination.base.next_output_byte = destination.block.get();
  destination.base.free_in_buffer = blockSize;
}

boolean LibjpegWriter::empty(j_compress_ptr codec) {
  append(codec, blockSize);  // whatever the counters say
  begin(codec);
  return TRUE;
}

void LibjpegWriter::end(j_compress_ptr codec) {
  append(codec, blockSize - destinationOf(codec).base.free_in_buffer);
}

}  // namespace pelorin::photo
