#include "photo/jpeg/jpeg_picture_reader.h"

#include <algorithm>
#include <array>
#include <bit>
#include <memory>
#include <vector>

#include "photo/jpeg/jpeg_limits.h"

namespace pelorin::photo {
namespace {

constexpr int profileMarker = JPEG_APP0 + 2;

unsigned divisorFor(int scale) {
  return std::min(8u, std::bit_floor(static_cast<unsigned>(std::max(1, scale))));
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

std::vector<std::uint8_t> embeddedProfile(LibjpegReader& reader) {
  JOCTET* bytes = nullptr;
  unsigned length = 0;
  reader.run([&] { jpeg_read_icc_profile(&reader.codec(), &bytes, &length); });
  const std::unique_ptr<JOCTET, DecodedPicture::Free> owner(bytes);
  return {bytes, bytes + length};
}

}  // namespace

JpegPictureReader::JpegPictureReader(const FileView& file, int scale, const DecodeLimits& limits,
                                     Keep keep)
    : reader_(file) {
  if (keep == Keep::everySegment) {
    reader_.keepAllSegments();
  } else {
    reader_.keepSegments(profileMarker);
  }
  reader_.readHeader(limits.segments);
  reader_.keepNoMoreSegments();
  checkLimits(reader_, limits);
  chooseOutput(reader_.codec(), scale);
  reader_.run([this] { jpeg_calc_output_dimensions(&reader_.codec()); });
}

JpegHeader JpegPictureReader::header() const {
  return headerOf(reader_.codec());
}

std::uint32_t JpegPictureReader::width() {
  return reader_.codec().output_width;
}

std::uint32_t JpegPictureReader::height() {
  return reader_.codec().output_height;
}

void JpegPictureReader::begin() {
  jpeg_decompress_struct& codec = reader_.codec();
  reader_.run([&] { jpeg_start_decompress(&codec); });
  if (codec.out_color_space == JCS_CMYK)
    fromCmyk_.emplace(codec.saw_Adobe_marker != FALSE, embeddedProfile(reader_));
  begun_ = true;
}

void JpegPictureReader::end() {
  reader_.checkEveryChannelCame();
  reader_.run([this] { jpeg_finish_decompress(&reader_.codec()); });
}

void JpegPictureReader::read(std::uint8_t* rows, std::uint32_t count) {
  if (!begun_) begin();
  jpeg_decompress_struct& codec = reader_.codec();
  const JDIMENSION first = codec.output_scanline;
  reader_.run([&] {
    std::array<JSAMPROW, 16> pointers;
    while (codec.output_scanline < first + count) {
      for (JDIMENSION i = 0; i < pointers.size(); ++i) {
        const std::size_t row = std::min(codec.output_scanline - first + i, count - 1);
        pointers[i] = rows + row * codec.output_width * 4;
      }
      jpeg_read_scanlines(
          &codec, pointers.data(),
          std::min<JDIMENSION>(pointers.size(), first + count - codec.output_scanline));
    }
  });
  if (fromCmyk_) {
    for (std::uint32_t y = 0; y < count; ++y)
      fromCmyk_->convertRow(rows + std::size_t{y} * codec.output_width * 4, codec.output_width);
  }
  if (codec.output_scanline == codec.output_height) end();
}

}  // namespace pelorin::photo
