#include "tests/support/pictures.h"

#include <algorithm>

namespace pelorin::test_support {
namespace {

// Smooth value noise in 0 ... 255: a lattice of random bytes `cell` pixels apart, interpolated with
// the smoothstep polynomial in 16-bit fixed point.
class ValueNoise {
 public:
  ValueNoise(std::uint32_t width, std::uint32_t height, std::uint32_t cell, std::uint64_t seed)
      : cell_(cell), columns_(width / cell + 2) {
    Random random(seed);
    lattice_.resize(std::size_t{columns_} * (height / cell + 2));
    for (std::uint8_t& value : lattice_) value = static_cast<std::uint8_t>(random.next32() >> 24);
  }

  std::int32_t at(std::uint32_t x, std::uint32_t y) const {
    const std::size_t corner = std::size_t{y / cell_} * columns_ + x / cell_;
    const std::int64_t tx = smooth(x % cell_), ty = smooth(y % cell_);
    const std::int64_t top = mix(lattice_[corner], lattice_[corner + 1], tx);
    const std::int64_t bottom =
        mix(lattice_[corner + columns_], lattice_[corner + columns_ + 1], tx);
    return static_cast<std::int32_t>((top * (65536 - ty) + bottom * ty) >> 32);
  }

 private:
  std::int64_t smooth(std::uint32_t offset) const {
    const std::int64_t t = (std::int64_t{offset} << 16) / cell_;
    return ((t * t >> 16) * (3 * 65536 - 2 * t)) >> 16;
  }
  static std::int64_t mix(std::int64_t a, std::int64_t b, std::int64_t t) {
    return a * (65536 - t) + b * t;
  }

  std::uint32_t cell_;
  std::uint32_t columns_;
  std::vector<std::uint8_t> lattice_;
};

std::uint8_t toByte(std::int32_t value) {
  return static_cast<std::uint8_t>(std::clamp(value, 0, 255));
}

}  // namespace

std::uint32_t Random::next32() {
  state_ ^= state_ >> 12;
  state_ ^= state_ << 25;
  state_ ^= state_ >> 27;
  return static_cast<std::uint32_t>((state_ * 0x2545F4914F6CDD1Du) >> 32);
}

float Random::nextFloat() {
  return static_cast<float>(next32() >> 8) * 0x1p-24f;
}

std::uint32_t Random::below(std::uint32_t bound) {
  return static_cast<std::uint32_t>((std::uint64_t{next32()} * bound) >> 32);
}

std::vector<RGBA8Pixel> randomPixels(std::size_t count, std::uint64_t seed) {
  Random random(seed);
  std::vector<RGBA8Pixel> pixels(count);
  for (RGBA8Pixel& p : pixels) {
    const std::uint32_t bits = random.next32();
    p = {static_cast<std::uint8_t>(bits), static_cast<std::uint8_t>(bits >> 8),
         static_cast<std::uint8_t>(bits >> 16), static_cast<std::uint8_t>(bits >> 24)};
  }
  return pixels;
}

Image<RGBA8Pixel> noisePicture(std::uint32_t width, std::uint32_t height, std::uint64_t seed) {
  Image<RGBA8Pixel> image(width, height);
  const std::vector<RGBA8Pixel> pixels = randomPixels(image.pixelCount(), seed);
  std::copy(pixels.begin(), pixels.end(), image.data.get());
  return image;
}

Image<RGBA8Pixel> flatPicture(std::uint32_t width, std::uint32_t height, RGBA8Pixel pixel) {
  Image<RGBA8Pixel> image(width, height);
  image.set(pixel);
  return image;
}

Image<RGBA8Pixel> photoLikePicture(std::uint32_t width, std::uint32_t height, std::uint64_t seed) {
  Image<RGBA8Pixel> image(width, height);
  const std::uint32_t side = std::max(1u, std::min(width, height));
  const ValueNoise light(width, height, std::max(1u, side / 3), seed * 8 + 1);
  const ValueNoise hue(width, height, std::max(1u, side / 4), seed * 8 + 2);
  const ValueNoise objects(width, height, std::max(1u, side / 6), seed * 8 + 3);
  const ValueNoise texture(width, height, 3, seed * 8 + 4);
  Random grain(seed * 8 + 5);
  for (std::uint32_t y = 0; y < height; ++y) {
    for (std::uint32_t x = 0; x < width; ++x) {
      // A wide range of light: dark and blown parts exist, with hard edges where objects begin.
      const std::int32_t kind = objects.at(x, y) / 52;  // 0 ... 4
      std::int32_t base = (light.at(x, y) - 128) * 2 + 118 + (kind - 2) * 24;
      if (kind == 3) base += (texture.at(x, y) - 128) / 2;
      base += static_cast<std::int32_t>(grain.below(7)) - 3;
      const std::int32_t tint = hue.at(x, y) - 128;
      std::int32_t r = base, g = base, b = base;
      if (kind == 1) {  // skin
        r += 42;
        g += 8;
        b -= 18;
      } else if (kind == 2) {  // saturated
        r += tint;
        g -= tint / 2;
        b -= tint;
      } else if (kind == 4) {  // sky
        r -= 30;
        b += 40 + tint / 4;
      } else {
        r += tint / 6;
        b -= tint / 6;
      }
      image.row(y)[x] = {toByte(r), toByte(g), toByte(b), static_cast<std::uint8_t>(x * 5)};
    }
  }
  return image;
}

}  // namespace pelorin::test_support
