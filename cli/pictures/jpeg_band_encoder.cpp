#include "cli/pictures/jpeg_band_encoder.h"

#include <cstdlib>

#include "photo/jpeg/jpeg_codec.h"
#include "photo/jpeg/libjpeg_errors.h"

namespace pelorin::cli {

using image_processing::Image;
using image_processing::RGBA8Pixel;

struct JpegBandEncoder::State {
  photo::LibjpegErrors errors;
  jpeg_compress_struct jpeg = {};
  unsigned char* file = nullptr;
  unsigned long fileSize = 0;

  ~State() {
    // Until it ends, the library's destination moves its buffer without saying where to.
    if (jpeg.dest != nullptr) jpeg.dest->term_destination(&jpeg);
    jpeg_destroy_compress(&jpeg);
    std::free(file);
  }
};

JpegBandEncoder::JpegBandEncoder(std::uint32_t width, std::uint32_t height, int quality) {
  if (width == 0 || height == 0 || width > largestSide || height > largestSide) {
    throw photo::PhotoError(photo::PhotoError::Kind::invalidRequest,
                            "a JPEG file is 1 to 65500 pixels wide and high");
  }
  state_ = std::make_unique<State>();
  State& s = *state_;
  s.jpeg.err = s.errors.manager();
  s.errors.run([&] {
    jpeg_create_compress(&s.jpeg);
    jpeg_mem_dest(&s.jpeg, &s.file, &s.fileSize);
    s.jpeg.image_width = width;
    s.jpeg.image_height = height;
    s.jpeg.input_components = 4;
    s.jpeg.in_color_space = JCS_EXT_RGBA;
    jpeg_set_defaults(&s.jpeg);
    jpeg_set_quality(&s.jpeg, quality, TRUE);
    // Thin text is a large part of the picture: full resolution for colour too.
    s.jpeg.comp_info[0].h_samp_factor = s.jpeg.comp_info[0].v_samp_factor = 1;
    jpeg_start_compress(&s.jpeg, TRUE);
  });
}

JpegBandEncoder::~JpegBandEncoder() = default;

void JpegBandEncoder::add(const Image<RGBA8Pixel>& band) {
  state_->errors.run([&] {
    for (std::uint32_t y = 0; y < band.height; ++y) {
      JSAMPROW row = &band.row(y)->r;
      jpeg_write_scanlines(&state_->jpeg, &row, 1);
    }
  });
}

std::vector<std::uint8_t> JpegBandEncoder::finish() {
  state_->errors.run([&] { jpeg_finish_compress(&state_->jpeg); });
  return {state_->file, state_->file + state_->fileSize};
}

}  // namespace pelorin::cli
