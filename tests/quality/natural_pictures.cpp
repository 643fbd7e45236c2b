#include "tests/quality/natural_pictures.h"

#include <algorithm>
#include <cmath>
#include <numbers>

#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

constexpr float octaveDeviation = 12.0f;
constexpr float octaveBlur = 0.6f;

// The sum of twelve uniform numbers is close to normal, with deviation 1.
float nextNormal(Random& random) {
  float sum = -6.0f;
  for (int i = 0; i < 12; ++i) sum += random.nextFloat();
  return sum;
}

GreyPlane blurredAlongRows(const GreyPlane& plane, float sigma) {
  const int radius = static_cast<int>(3.0f * sigma + 1.0f);
  std::vector<float> weights;
  float total = 0.0f;
  for (int k = -radius; k <= radius; ++k) {
    weights.push_back(std::exp(-static_cast<float>(k * k) / (2.0f * sigma * sigma)));
    total += weights.back();
  }
  GreyPlane result(plane.width, plane.height, 0.0f);
  for (std::uint32_t y = 0; y < plane.height; ++y) {
    for (int x = 0; x < static_cast<int>(plane.width); ++x) {
      float sum = 0.0f;
      for (int k = -radius; k <= radius; ++k)
        sum += weights[k + radius] *
               plane.at(std::clamp(x + k, 0, static_cast<int>(plane.width) - 1), y);
      result.at(x, y) = sum / total;
    }
  }
  return result;
}

GreyPlane transposed(const GreyPlane& plane) {
  GreyPlane result(plane.height, plane.width, 0.0f);
  for (std::uint32_t y = 0; y < plane.height; ++y)
    for (std::uint32_t x = 0; x < plane.width; ++x) result.at(y, x) = plane.at(x, y);
  return result;
}

// A block of 8 x 8 times the cosine basis, along columns; `back` inverts.
void transformColumns(float (&block)[8][8], bool back) {
  float result[8][8];
  for (int k = 0; k < 8; ++k) {
    for (int x = 0; x < 8; ++x) {
      float sum = 0.0f;
      for (int n = 0; n < 8; ++n) {
        const int frequency = back ? n : k, place = back ? k : n;
        const float angle =
            std::numbers::pi_v<float> * (static_cast<float>(place) + 0.5f) * frequency / 8.0f;
        sum += std::cos(angle) * (frequency == 0 ? std::sqrt(0.125f) : 0.5f) * block[n][x];
      }
      result[k][x] = sum;
    }
  }
  std::copy_n(&result[0][0], 64, &block[0][0]);
}

void transpose(float (&block)[8][8]) {
  for (int y = 0; y < 8; ++y)
    for (int x = 0; x < y; ++x) std::swap(block[y][x], block[x][y]);
}

}  // namespace

GreyPlane naturalPlane(std::uint32_t width, std::uint32_t height, std::uint64_t seed) {
  if (width < 2 || height < 2) return GreyPlane(width, height, 128.0f);
  const GreyPlane coarse = naturalPlane((width + 1) / 2, (height + 1) / 2, seed + 1000);
  GreyPlane plane(width, height, 0.0f);
  for (std::uint32_t y = 0; y < height; ++y)
    for (std::uint32_t x = 0; x < width; ++x) plane.at(x, y) = coarse.at(x / 2, y / 2);
  plane = blurred(plane, 1.0f);

  const GreyPlane octave = blurred(noisy(GreyPlane(width, height, 0.0f), 1.0f, seed), octaveBlur);
  float squares = 0.0f;
  for (const float value : octave.values) squares += value * value;
  const float gain =
      octaveDeviation / std::sqrt(squares / static_cast<float>(octave.values.size()));
  for (std::size_t i = 0; i < plane.values.size(); ++i) plane.values[i] += gain * octave.values[i];
  return plane;
}

GreyPlane blurred(const GreyPlane& plane, float sigma) {
  return transposed(blurredAlongRows(transposed(blurredAlongRows(plane, sigma)), sigma));
}

GreyPlane noisy(GreyPlane plane, float deviation, std::uint64_t seed) {
  Random random(seed);
  for (float& value : plane.values) value += deviation * nextNormal(random);
  return plane;
}

GreyPlane compressed(GreyPlane plane, float step) {
  for (std::uint32_t top = 0; top + 8 <= plane.height; top += 8) {
    for (std::uint32_t left = 0; left + 8 <= plane.width; left += 8) {
      float block[8][8];
      for (int y = 0; y < 8; ++y)
        for (int x = 0; x < 8; ++x) block[y][x] = plane.at(left + x, top + y);
      for (const bool back : {false, true}) {
        transformColumns(block, back);
        transpose(block);
        transformColumns(block, back);
        transpose(block);
        if (back) continue;
        for (int v = 0; v < 8; ++v) {
          for (int u = 0; u < 8; ++u) {
            const float grown = step * static_cast<float>(1 + u + v);
            block[v][u] = std::round(block[v][u] / grown) * grown;
          }
        }
      }
      for (int y = 0; y < 8; ++y)
        for (int x = 0; x < 8; ++x) plane.at(left + x, top + y) = block[y][x];
    }
  }
  return plane;
}

Image<RGBA8Pixel> toPicture(const GreyPlane& plane) {
  Image<RGBA8Pixel> picture(plane.width, plane.height);
  for (std::size_t i = 0; i < plane.values.size(); ++i) {
    const auto grey = static_cast<std::uint8_t>(std::clamp(plane.values[i] + 0.5f, 0.0f, 255.0f));
    picture.data.get()[i] = {grey, grey, grey, 255};
  }
  return picture;
}

}  // namespace pelorin::test_support
