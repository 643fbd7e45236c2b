#include "image_processing/autoenhance/masks/mask_rows.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <vector>

#include "image_processing/autoenhance/masks/bilateral_grid.h"
#include "image_processing/autoenhance/masks/grid_blur.h"
#include "image_processing/autoenhance/masks/grid_splat.h"
#include "image_processing/autoenhance/masks/image_masks.h"
#include "image_processing/autoenhance/masks/spatial_extent.h"
#include "tests/support/faces.h"
#include "tests/support/mask_types.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::MaskTypes;
using test_support::photoLikePicture;
using test_support::withFaces;

template <typename T>
struct Masks {
  Masks(std::uint32_t width, std::uint32_t height) : bilateral(width, height), ltm(width, height) {}
  Image<T> bilateral, ltm;
};

Image<float> lightnessOf(const Image<RGBA8Pixel>& photo) {
  Image<float> lightness(photo.width, photo.height);
  LightnessRow row(photo.width);
  for (std::uint32_t y = 0; y < photo.height; ++y) {
    std::copy_n(row.of(photo.row(y)), photo.width, lightness.row(y));
  }
  return lightness;
}

template <typename T>
Masks<T> byPicture(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                   const FilterConfig& config) {
  Masks<T> masks(photo.width, photo.height);
  const Image<float> lightness = lightnessOf(photo);
  bilateralFilterGridApproximationScalar(lightness, config.bilateralRange,
                                         spatialExtent(photo.width, photo.height, config),
                                         masks.bilateral);
  computeLtmMask(metadata, photo, lightness, masks.bilateral, config.ltmMaskAmount,
                 config.ltmMaskRadius, masks.ltm);
  return masks;
}

// As many steps as are allowed are prepared from the last to the first, then finished in order, in
// no more memory than is asked for.
template <typename T>
Masks<T> byRows(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                const FilterConfig& config, int stepsAtOnce) {
  Masks<T> masks(photo.width, photo.height);
  const Image<float> lightness = lightnessOf(photo);
  const float cellSize = gridCellSize(spatialExtent(photo.width, photo.height, config));
  Grid grid = makeGrid(photo.width, photo.height, cellSize);
  splat(lightness, cellSize, grid);
  blur(grid, config.bilateralRange);

  using Rows = MaskRows<T, T>;
  const std::uint32_t held = Rows::rowsHeld(photo.height, config, stepsAtOnce);
  Rows rows(
      grid, cellSize, photo.width, photo.height, config, metadata,
      [&](std::uint32_t y) { return photo.row(y); }, RowRing<T>(photo.width, held), stepsAtOnce);
  typename Rows::Scratch scratch(rows);
  FaceBlendRows::Scratch faces;
  std::uint32_t y = 0;
  for (std::int64_t first = 0; first < rows.steps(); first += stepsAtOnce) {
    const std::int64_t end = std::min(first + stepsAtOnce, rows.steps());
    for (std::int64_t step = end; step-- > first;) rows.prepare(step, scratch);
    for (std::int64_t step = first; step < end; ++step) {
      rows.sum(step, scratch.lightness);
      for (; y < rows.maskEnd(step); ++y) {
        std::copy_n(rows.bilateral(y), photo.width, masks.bilateral.row(y));
        rows.writeLtm(y, masks.ltm.row(y), faces);
      }
    }
  }
  EXPECT_EQ(y, photo.height);
  return masks;
}

template <typename T>
class MaskRowsOf : public testing::Test {
 protected:
  void expectTheMasks(std::uint32_t width, std::uint32_t height, const FilterConfig& config) {
    const Image<RGBA8Pixel> photo = photoLikePicture(width, height, 8);
    const auto w = static_cast<std::int32_t>(width), h = static_cast<std::int32_t>(height);
    const ImageMetadata metadata =
        withFaces({{.left = w / 4, .right = w / 2, .bottom = h / 2, .top = h / 4}});
    const Masks<T> expected = byPicture<T>(photo, metadata, config);
    for (const int stepsAtOnce : {1, 2, 5}) {
      const Masks<T> actual = byRows<T>(photo, metadata, config, stepsAtOnce);
      const auto same = [](const Image<T>& a, const Image<T>& b) {
        return std::memcmp(a.data.get(), b.data.get(), a.byteSize()) == 0;
      };
      EXPECT_TRUE(same(actual.bilateral, expected.bilateral))
          << width << " x " << height << ", " << stepsAtOnce << " steps at once";
      EXPECT_TRUE(same(actual.ltm, expected.ltm))
          << width << " x " << height << ", " << stepsAtOnce << " steps at once";
    }
  }
};
TYPED_TEST_SUITE(MaskRowsOf, MaskTypes);

TYPED_TEST(MaskRowsOf, AreThoseOfThePictureHoweverManyStepsArePreparedAtOnce) {
  for (const auto& [width, height] :
       std::vector<std::pair<std::uint32_t, std::uint32_t>>{{1, 1}, {1, 90}, {90, 1}, {31, 200}})
    this->expectTheMasks(width, height, FilterConfig());
}

TYPED_TEST(MaskRowsOf, AreThoseOfThePictureWithAnyWindow) {
  for (const int radius : {0, 1, 15, 16, 33, 120}) {
    FilterConfig config;
    config.ltmMaskRadius = radius;
    this->expectTheMasks(23, 110, config);
  }
}

TYPED_TEST(MaskRowsOf, HaveFacesAloneWithoutFlatness) {
  FilterConfig config;
  config.ltmMaskAmount = 0.0f;
  this->expectTheMasks(40, 70, config);
}

}  // namespace
}  // namespace pelorin::image_processing
