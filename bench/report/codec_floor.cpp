#include "bench/report/codec_floor.h"

// jpeglib.h needs FILE from before it.
// clang-format off
#include <cstdio>
#include <jpeglib.h>
// clang-format on
#include <algorithm>
#include <cstring>

namespace pelorin::bench {

CodecFloor::CodecFloor(std::span<const std::uint8_t> file, std::uint32_t width,
                       std::uint32_t height)
    : file_(file),
      width_(width),
      height_(height),
      decoded_(width_ * height_ * 4),
      copied_(decoded_.size()),
      encoded_(decoded_.size()) {}

void CodecFloor::run() {
  decode();
  std::memcpy(copied_.data(), decoded_.data(), decoded_.size());
  encode();
}

void CodecFloor::decode() {
  jpeg_error_mgr errors;
  jpeg_decompress_struct codec = {};
  codec.err = jpeg_std_error(&errors);
  jpeg_create_decompress(&codec);
  jpeg_mem_src(&codec, file_.data(), file_.size());
  jpeg_read_header(&codec, TRUE);
  codec.out_color_space = JCS_EXT_RGBA;
  jpeg_start_decompress(&codec);
  while (codec.output_scanline < codec.output_height) {
    JSAMPROW rows[16];
    for (std::size_t i = 0; i < 16; ++i) {
      rows[i] = rowOf(decoded_, std::min(codec.output_scanline + i, height_ - 1));
    }
    jpeg_read_scanlines(&codec, rows, 16);
  }
  jpeg_finish_decompress(&codec);
  jpeg_destroy_decompress(&codec);
}

void CodecFloor::encode() {
  jpeg_error_mgr errors;
  jpeg_compress_struct codec = {};
  codec.err = jpeg_std_error(&errors);
  jpeg_create_compress(&codec);
  unsigned char* place = encoded_.data();  // large enough to stay where it is
  unsigned long size = encoded_.size();
  jpeg_mem_dest(&codec, &place, &size);
  codec.image_width = static_cast<JDIMENSION>(width_);
  codec.image_height = static_cast<JDIMENSION>(height_);
  codec.input_components = 4;
  codec.in_color_space = JCS_EXT_RGBA;
  jpeg_set_defaults(&codec);
  jpeg_set_quality(&codec, 90, TRUE);
  jpeg_start_compress(&codec, TRUE);
  while (codec.next_scanline < codec.image_height) {
    JSAMPROW row = rowOf(copied_, codec.next_scanline);
    jpeg_write_scanlines(&codec, &row, 1);
  }
  jpeg_finish_compress(&codec);
  jpeg_destroy_compress(&codec);
}

}  // namespace pelorin::bench
