#include <algorithm>
#include <string_view>

#include "photo/jpeg/jpeg_picture_reader.h"

namespace pelorin::photo {
namespace {

bool isAdobe(const jpeg_marker_struct& segment) {
  constexpr std::string_view name = "Adobe";
  return segment.marker == JPEG_APP0 + 14 && segment.data_length >= name.size() &&
         std::string_view(reinterpret_cast<const char*>(segment.data), name.size()) == name;
}

// Of the first component and, where there are three, of the second.
JpegCoding codingOf(const jpeg_decompress_struct& codec) {
  JpegCoding coding = {.progressive = codec.progressive_mode != FALSE,
                       .grey = codec.num_components == 1};
  const int parts = codec.num_components == 3 ? 2 : 1;
  for (int i = 0; i < parts; ++i) {
    const int number = codec.comp_info[i].quant_tbl_no;
    if (number < 0 || number >= NUM_QUANT_TBLS || codec.quant_tbl_ptrs[number] == nullptr) break;
    JpegCoding::QuantizationTable& table = coding.tables.emplace_back();
    std::copy_n(codec.quant_tbl_ptrs[number]->quantval, table.size(), table.begin());
  }
  if (codec.num_components != 3) return coding;
  const jpeg_component_info &brightness = codec.comp_info[0], &blue = codec.comp_info[1],
                            &red = codec.comp_info[2];
  const ChromaSampling sampling = {brightness.h_samp_factor / std::max(blue.h_samp_factor, 1),
                                   brightness.v_samp_factor / std::max(blue.v_samp_factor, 1)};
  constexpr int most = 8;  // samples of brightness in a block of ten
  const bool isPlain = blue.h_samp_factor == red.h_samp_factor &&
                       blue.v_samp_factor == red.v_samp_factor &&
                       sampling.across * blue.h_samp_factor == brightness.h_samp_factor &&
                       sampling.down * blue.v_samp_factor == brightness.v_samp_factor &&
                       sampling.across * sampling.down <= most;
  if (isPlain) coding.sampling = sampling;
  return coding;
}

}  // namespace

JpegHeader headerOf(const jpeg_decompress_struct& codec) {
  JpegHeader header = {
      codec.image_width, codec.image_height, codec.num_components, codingOf(codec), {}};
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
