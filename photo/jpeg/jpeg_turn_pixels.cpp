#include "photo/jpeg/jpeg_turn_pixels.h"

#include <cstring>

#include "photo/jpeg/libjpeg_reader.h"
#include "photo/jpeg/libjpeg_writer.h"

namespace pelorin::photo {
namespace {

struct Samples {
  std::uint32_t width, height;
  std::size_t channels;
  std::vector<std::uint8_t> bytes;

  std::uint8_t* at(std::size_t row, std::size_t column) {
    return bytes.data() + (row * width + column) * channels;
  }
};

Samples samplesOf(std::uint32_t width, std::uint32_t height, std::size_t channels) {
  return {width, height, channels, std::vector<std::uint8_t>(width * channels * height)};
}

// In the colours of the file.
Samples decode(LibjpegReader& reader, unsigned divisor) {
  jpeg_decompress_struct& codec = reader.codec();
  codec.out_color_space = codec.jpeg_color_space;
  codec.scale_num = 1;
  codec.scale_denom = divisor;
  reader.run([&] { jpeg_calc_output_dimensions(&codec); });
  Samples samples = samplesOf(codec.output_width, codec.output_height,
                              static_cast<std::size_t>(codec.num_components));
  reader.run([&] {
    jpeg_start_decompress(&codec);
    while (codec.output_scanline < codec.output_height) {
      JSAMPROW row = samples.at(codec.output_scanline, 0);
      jpeg_read_scanlines(&codec, &row, 1);
    }
  });
  reader.checkEveryChannelCame();
  return samples;
}

Samples turned(Samples samples, const Turn& turn) {
  Samples result = turn.swapsAxes() ? samplesOf(samples.height, samples.width, samples.channels)
                                    : samplesOf(samples.width, samples.height, samples.channels);
  for (std::uint32_t y = 0; y < result.height; ++y) {
    for (std::uint32_t x = 0; x < result.width; ++x) {
      const Turn::Place from = turn.sourceOf({y, x}, samples.height, samples.width);
      std::memcpy(result.at(y, x), samples.at(from.row, from.column), samples.channels);
    }
  }
  return result;
}

}  // namespace

std::vector<std::uint8_t> turnPixels(std::span<const std::uint8_t> file, const Turn& turn,
                                     unsigned divisor) {
  LibjpegReader reader(file);
  reader.keepAllSegments();
  reader.readHeader();
  Samples samples = turned(decode(reader, divisor), turn);
  const jpeg_decompress_struct& source = reader.codec();
  LibjpegWriter writer(file.size());
  jpeg_compress_struct& target = writer.codec();
  writer.run([&] {
    target.image_width = samples.width;
    target.image_height = samples.height;
    target.input_components = source.num_components;
    target.in_color_space = source.jpeg_color_space;
    jpeg_set_defaults(&target);
    jpeg_set_colorspace(&target, source.jpeg_color_space);
    jpeg_set_quality(&target, 100, TRUE);
    for (int i = 0; i < target.num_components; ++i)
      target.comp_info[i].h_samp_factor = target.comp_info[i].v_samp_factor = 1;
    if (source.progressive_mode) jpeg_simple_progression(&target);
    target.write_JFIF_header = target.write_Adobe_marker = FALSE;
    jpeg_start_compress(&target, TRUE);
    writer.copySegments(source);
    while (target.next_scanline < target.image_height) {
      JSAMPROW row = samples.at(target.next_scanline, 0);
      jpeg_write_scanlines(&target, &row, 1);
    }
    jpeg_finish_compress(&target);
  });
  return writer.takeFile();
}

}  // namespace pelorin::photo
