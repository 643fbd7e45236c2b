// Every fast variant of the preparation beside its definition, byte for byte.
#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>
#include <numeric>
#include <utility>
#include <vector>

#include "image_processing/autoenhance/colour/companding_steps.h"
#include "image_processing/autoenhance/colour/lab.h"
#include "image_processing/autoenhance/lightness/lightness_counter.h"
#include "image_processing/autoenhance/masks/flatness_mask.h"
#include "image_processing/autoenhance/masks/flatness_rows.h"
#include "image_processing/autoenhance/masks/grid_blur.h"
#include "image_processing/autoenhance/masks/grid_slice.h"
#include "image_processing/autoenhance/masks/grid_splat.h"
#include "image_processing/autoenhance/masks/summed_area_rows.h"
#include "tests/support/fingerprint.h"
#include "tests/support/instruction_sets.h"
#include "tests/support/pictures.h"
#include "tests/support/slow_build.h"

namespace pelorin::image_processing {
namespace {

using Quantized = QuantizedFloat<unsigned char>;
using test_support::fingerprint;
using test_support::onEveryInstructionSet;
using test_support::photoLikePicture;
using test_support::Random;
using test_support::randomPixels;

TEST(CompandingSteps, MatchTheirDefinitionAtEveryTailLength) {
  for (std::size_t count = 0; count <= 70; ++count) {
    const auto pixels = randomPixels(count, count);
    std::vector<std::uint16_t> expected(count + 1, 0xABCD);
    compandingStepsScalar(pixels.data(), expected.data(), count);
    onEveryInstructionSet(
        [&] {
          std::vector<std::uint16_t> actual(count + 1, 0xABCD);
          compandingSteps(pixels.data(), actual.data(), count);
          ASSERT_EQ(actual, expected) << count;
        },
        HWY_AVX3_DL);
  }
}

TEST(CompandingSteps, MatchTheirDefinitionForMillionsOfColours) {
  const std::size_t count = test_support::slowBuild ? 1 << 16 : 1 << 22;
  const auto pixels = randomPixels(count, 1);
  std::vector<std::uint16_t> expected(count), actual(count);
  compandingStepsScalar(pixels.data(), expected.data(), count);
  onEveryInstructionSet(
      [&] {
        compandingSteps(pixels.data(), actual.data(), count);
        ASSERT_EQ(actual, expected);
      },
      HWY_AVX3_DL);
}

TEST(CompandingSteps, DetermineLightness) {
  for (const RGBA8Pixel& p : randomPixels(5000, 2)) {
    std::uint16_t step;
    compandingStepsScalar(&p, &step, 1);
    const float L = rgbToLab(p.r, p.g, p.b).L;
    ASSERT_EQ(lightnessOfSteps()[step], L);
    ASSERT_EQ(unitLightnessOfSteps()[step], L / 100.0f);
  }
}

TEST(LightnessCounter, FindsTheBinOfEveryStep) {
  std::vector<std::uint16_t> steps(compandingStepCount);
  std::iota(steps.begin(), steps.end(), std::uint16_t{0});
  for (std::size_t step = 0; step < compandingStepCount; ++step) {
    LightnessHistogram expected(lightnessBins, lightnessScale);
    expected.add(&steps[step], 1);
    LightnessCounter counter;
    counter.add(&unitLightnessOfSteps()[step], 1);
    ASSERT_EQ(normalised(counter.counts()), expected.normalised()) << step;
  }
  LightnessHistogram expected(lightnessBins, lightnessScale);
  expected.add(steps.data(), steps.size());
  onEveryInstructionSet([&] {
    LightnessCounter counter;
    counter.add(unitLightnessOfSteps().data(), compandingStepCount);
    ASSERT_EQ(normalised(counter.counts()), expected.normalised());
  });
}

TEST(LightnessCounter, MatchesTheHistogramAtEveryTailLength) {
  Random random(3);
  for (std::size_t count = 0; count <= 1100; count += count < 140 ? 1 : 37) {
    std::vector<std::uint16_t> steps(count);
    for (auto& step : steps) step = static_cast<std::uint16_t>(random.below(compandingStepCount));
    std::vector<float> lightness(count);
    unitLightness(steps.data(), lightness.data(), count);
    LightnessHistogram expected(lightnessBins, lightnessScale);
    expected.add(steps.data(), count);
    onEveryInstructionSet([&] {
      LightnessCounter counter;
      counter.add(lightness.data(), count);
      if (count == 0) unitLightness(nullptr, nullptr, 0);  // some kernel is to be called
      ASSERT_EQ(normalised(counter.counts()), expected.normalised()) << count;
    });
  }
}

struct Geometry {
  std::uint32_t width, height;
  float cellSize;
};

const std::vector<Geometry> geometries = {
    {1, 1, 1},   {1, 9, 1},     {9, 1, 1},     {2, 2, 1},
    {5, 4, 2},   {7, 5, 9},     {23, 20, 5},   {64, 48, 3},
    {97, 61, 7}, {160, 90, 4},  {131, 77, 77}, {300, 7, 7},
    {7, 300, 3}, {200, 150, 1}, {640, 3, 3},   {test_support::slowBuild ? 3000u : 65500u, 1, 1}};

/// Smooth, rough or odd lightness.
Image<float> lightnessOf(const Geometry& g, std::uint64_t seed) {
  Image<float> image(g.width, g.height);
  Random random(seed);
  const auto photo = photoLikePicture(g.width, g.height, seed);
  for (std::size_t i = 0; i < image.pixelCount(); ++i) {
    const float smooth = photo.data.get()[i].g / 255.0f;
    image.data.get()[i] = seed % 3 == 0 ? 0.5f : seed % 3 == 1 ? smooth : random.nextFloat();
  }
  if (seed == 5) {
    for (const float value : {-0.1f, 1.2f, 1e9f, -1e9f, 1.0f, 0.0f, std::nanf(""),
                              std::numeric_limits<float>::infinity()}) {
      image.data.get()[random.below(static_cast<std::uint32_t>(image.pixelCount()))] = value;
    }
  }
  return image;
}

Grid gridFor(const Geometry& g) {
  const auto cell = static_cast<std::uint32_t>(g.cellSize);
  return Grid(std::max(g.width / cell, 1u), std::max(g.height / cell, 1u));
}

std::string fingerprint(const Grid& grid) {
  return test_support::fingerprint(grid.cells.data(), grid.cells.size() * sizeof(GridCell));
}

TEST(GridSplat, MatchesItsDefinition) {
  for (const Geometry& g : geometries) {
    for (std::uint64_t seed = 0; seed < 6; ++seed) {
      const Image<float> lightness = lightnessOf(g, seed);
      Grid expected = gridFor(g);
      splatScalar(lightness, g.cellSize, expected);
      onEveryInstructionSet([&] {
        Grid actual = gridFor(g);
        splat(lightness, g.cellSize, actual);
        ASSERT_EQ(fingerprint(actual), fingerprint(expected))
            << g.width << " x " << g.height << ", seed " << seed;
      });
    }
  }
}

TEST(GridBlur, MatchesItsDefinition) {
  for (const Geometry& g : geometries) {
    const Image<float> lightness = lightnessOf(g, 1);
    Grid splatted = gridFor(g);
    splatScalar(lightness, g.cellSize, splatted);
    for (const float range :
         {0.7f, 0.0f, -1.0f, 0.03f, 1.0f / 32, 0.1f, 1.0f, 5.0f, 1e30f, std::nanf("")}) {
      if (g.width > 1000 && range != 0.7f) continue;  // takes its time
      Grid expected = splatted;
      blurScalar(expected, range);
      onEveryInstructionSet([&] {
        Grid actual = splatted;
        blur(actual, range);
        ASSERT_EQ(fingerprint(actual), fingerprint(expected))
            << g.width << " x " << g.height << ", range " << range;
      });
    }
  }
}

template <typename T>
class FastVariants : public testing::Test {};
using MaskTypes = testing::Types<float, Quantized>;
TYPED_TEST_SUITE(FastVariants, MaskTypes);

TYPED_TEST(FastVariants, OfTheGridSliceMatchItsDefinition) {
  for (const Geometry& g : geometries) {
    for (std::uint64_t seed = 0; seed < 5; ++seed) {
      const Image<float> lightness = lightnessOf(g, seed);
      Grid grid = gridFor(g);
      splatScalar(lightness, g.cellSize, grid);
      if (seed < 4) blurScalar(grid, seed == 3 ? 0.0f : 0.7f);  // without it nodes stay empty
      Image<TypeParam> expected(g.width, g.height);
      sliceScalar(grid, lightness, g.cellSize, expected);
      onEveryInstructionSet([&] {
        Image<TypeParam> actual(g.width, g.height);
        slice(grid, lightness, g.cellSize, actual);
        ASSERT_EQ(fingerprint(actual), fingerprint(expected))
            << g.width << " x " << g.height << ", seed " << seed;
      });
    }
  }
}

TEST(SumRows, MatchTheirDefinition) {
  for (const std::int64_t width :
       {2, 3, 4, 5, 17, 31, 32, 33, 34, 35, 36, 63, 64, 100, 257, 1000}) {
    const std::int64_t stride = width + sumRowsPadding;
    Random random(width);
    std::vector<float> above(stride), weights(sumRowsAtOnce * stride);
    for (float& sum : above) sum = 100.0f * random.nextFloat();
    for (float& weight : weights) weight = random.nextFloat() / 289.0f;
    std::vector<float> expected = weights;
    sumRowsScalar(above.data(), expected.data(), stride, width);
    onEveryInstructionSet([&] {
      std::vector<float> actual = weights;
      sumRows(above.data(), actual.data(), stride, width);
      for (std::int64_t i = 0; i < sumRowsAtOnce; ++i) {
        ASSERT_EQ(std::memcmp(&actual[i * stride], &expected[i * stride], width * sizeof(float)), 0)
            << "row " << i << " of width " << width;
      }
    });
  }
}

TEST(WeighRow, TakesEveryByteAsItsDefinitionDoes) {
  std::vector<Quantized> bytes(256);
  for (std::size_t i = 0; i < 256; ++i) {
    const auto byte = static_cast<unsigned char>(i);
    std::memcpy(static_cast<void*>(&bytes[i]), &byte, 1);
  }
  // Around a peak of 2^20 the weight changes with the last bit of its argument.
  for (const float offset : {0.0f, 1e-7f, 0.01f, -0.03f, 0.07f}) {
    const GaussianApproximation<float> weight(-0.08f, 0.08f, 0.0f, 1048576.0f);
    std::vector<float> lightness(256), expected(256), actual(256);
    for (std::size_t i = 0; i < 256; ++i) lightness[i] = bytes[i] + offset;
    weighRowScalar(weight, lightness.data(), bytes.data(), expected.data(), 256);
    onEveryInstructionSet([&] {
      weighRow(weight, lightness.data(), bytes.data(), actual.data(), 256);
      ASSERT_EQ(actual, expected) << offset;
    });
  }
}

TYPED_TEST(FastVariants, OfTheFlatnessMaskMatchItsDefinition) {
  for (const Geometry& g : geometries) {
    for (const int radius : {-1, 0, 1, 2, 3, 8, 40}) {
      const Image<float> lightness = lightnessOf(g, 1);
      Image<TypeParam> smoothed(g.width, g.height);
      Random random(radius + 2);
      for (std::size_t i = 0; i < smoothed.pixelCount(); ++i) {
        smoothed.data.get()[i] =
            std::min(lightness.data.get()[i] + 0.1f * (random.nextFloat() - 0.5f), 1.0f);
      }
      Image<TypeParam> expected(g.width, g.height);
      computeFlatnessMaskScalar(lightness, smoothed, radius, expected);
      const auto compare = [&] {
        Image<TypeParam> actual(g.width, g.height);
        computeFlatnessMask(lightness, smoothed, radius, actual);
        ASSERT_EQ(fingerprint(actual), fingerprint(expected))
            << g.width << " x " << g.height << ", radius " << radius;
      };
      if (radius < 0) {
        compare();  // without a kernel
      } else {
        onEveryInstructionSet(compare);
      }
    }
  }
}

}  // namespace
}  // namespace pelorin::image_processing
