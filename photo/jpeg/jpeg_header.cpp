#include <string_view>

#include "photo/jpeg/jpeg_picture_reader.h"

namespace pelorin::photo {
namespace {

bool isAdobe(const jpeg_marker_struct& segment) {
  constexpr std::string_view name = "Adobe";
  return segment.marker == JPEG_APP0 + 14 && segment.data_length >= name.size() &&
         std::string_view(reinterpret_cast<const char*>(segment.data), name.size()) == name;
}

}  // namespace

JpegHeader headerOf(const jpeg_decompress_struct& codec) {
  JpegHeader header = {codec.image_width,
                       codec.image_height,
                       codec.num_components,
                       codec.progressive_mode != FALSE,
                       {}};
  for (auto segment = codec.marker_list; segment != nullptr; segment = segment->next) {
    if (isAdobe(*segment)) continue;
    header.metadata.push_back(
        {segment->marker, {segment->data, segment->data + segment->data_length}});
  }
  return header;
}

JpegHeader readJpegHeader(std::span<const std::uint8_t> file) {
  LibjpegReader reader(file);
  reader.keepAllSegments();
  reader.readHeader();
  return headerOf(reader.codec());
}

}  // namespace pelorin::photo
