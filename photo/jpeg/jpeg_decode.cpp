#include <algorithm>
#include <array>
#include <bit>
#include <limits>
#include <new>

#include "photo/jpeg/cmyk_to_rgba.h"
#include "photo/jpeg/jpeg_codec.h"
#include "photo/jpeg/jpeg_limits.h"
#include "photo/jpeg/libjpeg_reader.h"

namespace pelorin::photo {
namespace {

constexpr int profileMarker = JPEG_APP0 + 2;

unsigned divisorFor(int scale) {
  return std::min(8u, std::bit_floor(static_cast<unsigned>(std::max(1, scale))));
}

std::unique_ptr<std::uint8_t, DecodedPicture::Free> allocateRgba(std::uint32_t width,
                                                                 std::uint32_t height) {
  const std::uint64_t size = std::uint64_t{width} * height * 4;
  if (size > std::numeric_limits<std::size_t>::max() / 2) throw std::bad_alloc();
  std::unique_ptr<std::uint8_t, DecodedPicture::Free> pixels(
      static_cast<std::uint8_t*>(std::malloc(static_cast<std::size_t>(size))));
  if (pixels == nullptr) throw std::bad_alloc();
  return pixels;
}

void chooseOutput(jpeg_decompress_struct& codec, int scale) {
  switch (codec.jpeg_color_space) {
    case JCS_GRAYSCALE:
    case JCS_RGB:
    case JCS_YCbCr:
      codec.out_color_space = JCS_EXT_RGBA;
      break;
    case JCS_CMYK:
    case JCS_YCCK:
      codec.out_color_space = JCS_CMYK;  // four bytes a pixel too, so it is converted in place
      break;
    default:
      throw PhotoError(PhotoError::Kind::unsupported, "unsupported: neither grey, colour nor CMYK");
  }
  codec.scale_num = 1;
  codec.scale_denom = divisorFor(scale);
}

// Within `run`.
void readRows(jpeg_decompress_struct& codec, std::uint8_t* pixels) {
  std::array<JSAMPROW, 16> rows;
  while (codec.output_scanline < codec.output_height) {
    for (std::size_t i = 0; i < rows.size(); ++i) {
      const std::size_t y =
          std::min<std::size_t>(codec.output_scanline + i, codec.output_height - 1);
      rows[i] = pixels + y * codec.output_width * 4;
    }
    jpeg_read_scanlines(&codec, rows.data(), rows.size());
  }
}

std::vector<std::uint8_t> embeddedProfile(LibjpegReader& reader) {
  JOCTET* bytes = nullptr;
  unsigned length = 0;
  reader.run([&] { jpeg_read_icc_profile(&reader.codec(), &bytes, &length); });
  const std::unique_ptr<JOCTET, DecodedPicture::Free> owner(bytes);
  return {bytes, bytes + length};
}

}  // namespace

DecodedPicture decodeJpeg(std::span<const std::uint8_t> file, int scale,
                          const DecodeLimits& limits) {
  DecodedPicture picture = {};
  const auto makeRoom = [&](std::uint32_t width, std::uint32_t height) {
    picture = {allocateRgba(width, height), width, height};
    return picture.pixels.get();
  };
  decodeJpegInto(makeRoom, file, scale, limits);
  return picture;
}

void decodeJpegInto(
    const std::function<std::uint8_t*(std::uint32_t width, std::uint32_t height)>& makeRoom,
    std::span<const std::uint8_t> file, int scale, const DecodeLimits& limits) {
  LibjpegReader reader(file);
  reader.keepSegments(profileMarker);
  reader.readHeader();
  checkLimits(reader, limits);

  jpeg_decompress_struct& codec = reader.codec();
  chooseOutput(codec, scale);
  reader.run([&] { jpeg_calc_output_dimensions(&codec); });
  std::uint8_t* const pixels = makeRoom(codec.output_width, codec.output_height);
  reader.run([&] {
    jpeg_start_decompress(&codec);
    readRows(codec, pixels);
  });
  reader.checkEveryChannelCame();
  if (codec.out_color_space == JCS_CMYK) {
    cmykToRgba(pixels, codec.output_width, codec.output_height, codec.saw_Adobe_marker != FALSE,
               embeddedProfile(reader));
  }
  reader.run([&] { jpeg_finish_decompress(&codec); });
}

}  // namespace pelorin::photo
