#include <cstdlib>
#include <cstring>

#include "photo/jpeg/jpeg_codec.h"

// A codec for tests where no JPEG library is at hand: a file is "RAW", one more byte, width and
// height in two bytes each, and RGBA pixels. What the natives do around a codec does not depend on
// how it codes.
namespace pelorin::photo {
namespace {

constexpr std::size_t headerSize = 8;

struct Raw {
  std::uint32_t width, height;
  const std::uint8_t* pixels;
};

Raw parse(std::span<const std::uint8_t> file) {
  if (file.size() < headerSize || std::memcmp(file.data(), "RAW", 3) != 0)
    throw PhotoError(PhotoError::Kind::notAPhoto, "no picture");
  const auto twoBytes = [&](int i) {
    return std::uint32_t{file[i]} | std::uint32_t{file[i + 1]} << 8;
  };
  const Raw raw{twoBytes(4), twoBytes(6), file.data() + headerSize};
  if (file.size() != headerSize + std::size_t{raw.width} * raw.height * 4)
    throw PhotoError(PhotoError::Kind::truncated, "truncated: the picture data ends early");
  return raw;
}

std::vector<std::uint8_t> makeFile(std::uint32_t width, std::uint32_t height) {
  std::vector<std::uint8_t> file(headerSize + std::size_t{width} * height * 4);
  const std::uint8_t header[headerSize] = {'R',
                                           'A',
                                           'W',
                                           0,
                                           static_cast<std::uint8_t>(width),
                                           static_cast<std::uint8_t>(width >> 8),
                                           static_cast<std::uint8_t>(height),
                                           static_cast<std::uint8_t>(height >> 8)};
  std::memcpy(file.data(), header, headerSize);
  return file;
}

}  // namespace

DecodedPicture decodeJpeg(std::span<const std::uint8_t> file, int scale, const DecodeLimits&) {
  const Raw raw = parse(file);
  const std::uint32_t divisor = scale >= 8 ? 8 : scale >= 4 ? 4 : scale >= 2 ? 2 : 1;
  DecodedPicture picture{{}, raw.width / divisor, raw.height / divisor};
  const std::size_t count = std::size_t{picture.width} * picture.height;
  picture.pixels.reset(static_cast<std::uint8_t*>(std::malloc(count * 4 + 1)));
  if (picture.pixels == nullptr) throw std::bad_alloc();
  for (std::size_t i = 0; i < count; ++i) {
    const std::size_t x = i % picture.width * divisor, y = i / picture.width * divisor;
    std::memcpy(picture.pixels.get() + i * 4, raw.pixels + (y * raw.width + x) * 4, 4);
  }
  return picture;
}

std::vector<std::uint8_t> encodeJpeg(const std::uint8_t* rgba, std::uint32_t width,
                                     std::uint32_t height, int quality,
                                     std::span<const MetadataSegment>, Chroma) {
  if (width == 0 || height == 0)
    throw PhotoError(PhotoError::Kind::invalidRequest, "a picture without pixels");
  std::vector<std::uint8_t> file = makeFile(width, height);
  file[3] = static_cast<std::uint8_t>(quality);
  std::memcpy(file.data() + headerSize, rgba, file.size() - headerSize);
  return file;
}

std::vector<std::uint8_t> rotateJpeg(std::span<const std::uint8_t> file, int degrees,
                                     const DecodeLimits&) {
  if (degrees % 90 != 0)
    throw PhotoError(PhotoError::Kind::invalidRequest, "the angle is no multiple of 90 degrees");
  const Raw raw = parse(file);
  std::vector<std::uint8_t> turned(file.begin(), file.end());
  std::uint32_t width = raw.width, height = raw.height;
  for (int quarter = (degrees / 90 % 4 + 4) % 4; quarter > 0; --quarter) {
    std::vector<std::uint8_t> next = makeFile(height, width);
    for (std::uint32_t y = 0; y < height; ++y)
      for (std::uint32_t x = 0; x < width; ++x)
        std::memcpy(&next[headerSize + (std::size_t{x} * height + height - 1 - y) * 4],
                    &turned[headerSize + (std::size_t{y} * width + x) * 4], 4);
    turned.swap(next);
    std::swap(width, height);
  }
  return turned;
}

}  // namespace pelorin::photo
