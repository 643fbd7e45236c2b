#include "tests/support/jpeg_files.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <stdexcept>

namespace pelorin::test_support {
namespace {

int bytesPerPixel(J_COLOR_SPACE space) {
  return space == JCS_GRAYSCALE ? 1 : space == JCS_CMYK ? 4 : 3;
}

Bytes photoSamples(const JpegRecipe& recipe) {
  const auto picture = photoLikePicture(recipe.width, recipe.height, /*seed=*/5);
  Bytes samples;
  for (std::size_t i = 0; i < picture.pixelCount(); ++i) {
    const RGBA8Pixel& p = picture.data.get()[i];
    if (recipe.samples == JCS_GRAYSCALE) {
      samples.push_back(p.g);
    } else if (recipe.samples == JCS_RGB) {
      samples.insert(samples.end(), {p.r, p.g, p.b});
    } else {
      const std::uint8_t black = static_cast<std::uint8_t>(i % 60);
      samples.insert(samples.end(),
                     {static_cast<std::uint8_t>(255 - p.r), static_cast<std::uint8_t>(255 - p.g),
                      static_cast<std::uint8_t>(255 - p.b), black});
    }
  }
  return samples;
}

}  // namespace

Bytes jpegOf(const Image<RGBA8Pixel>& picture, const std::vector<photo::MetadataSegment>& metadata,
             int quality) {
  return photo::encodeJpeg(reinterpret_cast<const std::uint8_t*>(picture.data.get()), picture.width,
                           picture.height, quality, metadata);
}

Bytes smallJpeg(std::uint64_t seed) {
  return jpegOf(photoLikePicture(48, 32, seed));
}

Image<RGBA8Pixel> decoded(const Bytes& file) {
  const photo::DecodedPicture picture = photo::decodeJpeg(file);
  Image<RGBA8Pixel> image(picture.width, picture.height);
  std::memcpy(image.data.get(), picture.pixels.get(), image.byteSize());
  return image;
}

Bytes makeJpeg(const JpegRecipe& recipe, const Bytes& pixels) {
  photo::LibjpegErrors errors;
  jpeg_compress_struct codec = {};
  codec.err = errors.manager();
  unsigned char* output = nullptr;
  unsigned long size = 0;
  errors.run([&] {
    jpeg_create_compress(&codec);
    jpeg_mem_dest(&codec, &output, &size);
    codec.image_width = recipe.width;
    codec.image_height = recipe.height;
    codec.input_components = bytesPerPixel(recipe.samples);
    codec.in_color_space = recipe.samples;
    jpeg_set_defaults(&codec);
    jpeg_set_colorspace(&codec, recipe.stored);
    jpeg_set_quality(&codec, recipe.quality, TRUE);
    codec.comp_info[0].h_samp_factor = recipe.horizontalSampling;
    codec.comp_info[0].v_samp_factor = recipe.verticalSampling;
    for (int i = 1; i < codec.num_components; ++i) {
      // Black is as fine as luminance.
      codec.comp_info[i].h_samp_factor = i == 3 ? recipe.horizontalSampling : 1;
      codec.comp_info[i].v_samp_factor = i == 3 ? recipe.verticalSampling : 1;
    }
    if (recipe.adobe) codec.write_Adobe_marker = *recipe.adobe;
    codec.arith_code = recipe.arithmetic;
    codec.restart_interval = static_cast<unsigned>(recipe.restartInterval);
    if (!recipe.scans.empty()) {
      codec.scan_info = recipe.scans.data();
      codec.num_scans = static_cast<int>(recipe.scans.size());
    }
    jpeg_start_compress(&codec, TRUE);
    for (const photo::MetadataSegment& segment : recipe.metadata) {
      jpeg_write_marker(&codec, segment.marker, segment.payload.data(),
                        static_cast<unsigned>(segment.payload.size()));
    }
    if (!recipe.profile.empty()) {
      jpeg_write_icc_profile(&codec, recipe.profile.data(),
                             static_cast<unsigned>(recipe.profile.size()));
    }
    while (codec.next_scanline < codec.image_height) {
      auto* row = const_cast<std::uint8_t*>(pixels.data()) +
                  std::size_t{codec.next_scanline} * recipe.width * bytesPerPixel(recipe.samples);
      jpeg_write_scanlines(&codec, &row, 1);
    }
    jpeg_finish_compress(&codec);
  });
  jpeg_destroy_compress(&codec);
  Bytes file(output, output + size);
  std::free(output);
  return file;
}

Bytes makeJpeg(const JpegRecipe& recipe) {
  return makeJpeg(recipe, photoSamples(recipe));
}

std::vector<jpeg_scan_info> completeProgressiveScans(int channels) {
  std::vector<jpeg_scan_info> scans = {{channels, {0, 1, 2, 3}, 0, 0, 0, 0}};
  for (int channel = 0; channel < channels; ++channel) scans.push_back({1, {channel}, 1, 63, 0, 0});
  return scans;
}

std::vector<jpeg_scan_info> progressiveScans(int count) {
  std::vector<jpeg_scan_info> scans = {{3, {0, 1, 2}, 0, 0, 0, 0}};
  constexpr int firstShift = 2;
  for (int channel = 0; channel < 3; ++channel) {
    for (int k = 1; k < 64; ++k) {
      scans.push_back({1, {channel}, k, k, 0, firstShift});
      for (int shift = firstShift; shift > 0; --shift) {
        scans.push_back({1, {channel}, k, k, shift, shift - 1});
      }
    }
  }
  scans.resize(static_cast<std::size_t>(count));
  return scans;
}

std::vector<jpeg_scan_info> channelScans() {
  return {{1, {0}, 0, 63, 0, 0}, {1, {1}, 0, 63, 0, 0}, {1, {2}, 0, 63, 0, 0}};
}

std::vector<jpeg_scan_info> greyScansBitByBit() {
  constexpr int topBit = 7;
  std::vector<jpeg_scan_info> scans = {{1, {0}, 0, 0, 0, 0}};
  for (int k = 1; k < 64; ++k) {
    scans.push_back({1, {0}, k, k, 0, topBit});
    for (int bit = topBit; bit > 0; --bit) scans.push_back({1, {0}, k, k, bit, bit - 1});
  }
  return scans;
}

std::size_t findSegment(const Bytes& file, std::uint8_t marker, int nth) {
  for (std::size_t i = 2; i + 1 < file.size(); ++i) {
    if (file[i] == 0xFF && file[i + 1] == marker && nth-- == 0) return i;
  }
  throw std::logic_error("the file has no such segment");
}

Bytes withSize(Bytes file, std::uint32_t width, std::uint32_t height) {
  file = withFrameByte(std::move(file), 3, static_cast<std::uint8_t>(height >> 8));
  file = withFrameByte(std::move(file), 4, static_cast<std::uint8_t>(height));
  file = withFrameByte(std::move(file), 5, static_cast<std::uint8_t>(width >> 8));
  return withFrameByte(std::move(file), 6, static_cast<std::uint8_t>(width));
}

Bytes withFrameByte(Bytes file, std::size_t offset, std::uint8_t value) {
  const Bytes frames = {0xC0, 0xC2, 0xC9};  // baseline, progressive, arithmetic
  std::size_t frame = 2;
  while (file.at(frame) != 0xFF || std::ranges::find(frames, file.at(frame + 1)) == frames.end()) {
    ++frame;
  }
  file[frame + 2 + offset] = value;
  return file;
}

double meanDifference(const std::uint8_t* a, const std::uint8_t* b, std::size_t pixels) {
  double sum = 0;
  for (std::size_t i = 0; i < pixels * 4; ++i) {
    if (i % 4 != 3) sum += std::abs(a[i] - b[i]);
  }
  return sum / (3.0 * static_cast<double>(pixels));
}

Bytes rgbaBytes(const photo::DecodedPicture& picture) {
  return {picture.pixels.get(),
          picture.pixels.get() + std::size_t{picture.width} * picture.height * 4};
}

}  // namespace pelorin::test_support
