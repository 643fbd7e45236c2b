#include "image_processing/quality/block_features.h"

#include <limits>

#include "image_processing/core/require.h"
#include "image_processing/quality/ggd.h"
#include "image_processing/quality/write_features.h"

namespace pelorin::image_processing {
namespace {

std::uint32_t wrapped(std::int64_t index, std::uint32_t size) {
  return static_cast<std::uint32_t>((index % size + size) % size);
}

}  // namespace

void buildBlock(const Image<float>& structure, std::uint32_t x0, std::uint32_t y0, int dy, int dx,
                Image<float>& block) {
  if (std::uint64_t{x0} + block.width > structure.width ||
      std::uint64_t{y0} + block.height > structure.height)
    return block.set(std::numeric_limits<float>::quiet_NaN());

  for (std::uint32_t j = 0; j < block.height; ++j) {
    for (std::uint32_t i = 0; i < block.width; ++i) {
      const float value = structure.row(y0 + j)[x0 + i];
      if (dy == 0 && dx == 0) {
        block.row(j)[i] = value;
      } else {
        const std::uint32_t row = y0 + wrapped(std::int64_t{j} - dy, block.height);
        const std::uint32_t column = x0 + wrapped(std::int64_t{i} - dx, block.width);
        block.row(j)[i] = value * structure.row(row)[column];
      }
    }
  }
}

void requireRoomForFeatures(const Image<float>& features, std::uint32_t featuresPerScale,
                            std::uint32_t blockColumns, std::uint32_t blockRows,
                            std::uint32_t scale) {
  require(holds(features, std::uint64_t{blockColumns} * blockRows,
                std::uint64_t{featuresPerScale} * scale + niqeFeaturesPerScale),
          "block features: the feature image is too small");
}

void computeBlockFeaturesScalar(const Image<float>& structure, std::uint32_t featuresPerScale,
                                std::uint32_t blockSize, std::uint32_t blockColumns,
                                std::uint32_t blockRows, std::uint32_t scale,
                                Image<float>& features) {
  requireRoomForFeatures(features, featuresPerScale, blockColumns, blockRows, scale);
  const std::uint32_t side = blockSize / (scale + 1);
  Image<float> block(side, side);
  for (std::uint32_t row = 0; row < blockRows; ++row) {
    for (std::uint32_t column = 0; column < blockColumns; ++column) {
      std::array<Ggd, niqeShifts.size()> fits;
      for (std::size_t i = 0; i < fits.size(); ++i) {
        const auto [dy, dx] = niqeShifts[i];
        buildBlock(structure, column * side, row * side, dy, dx, block);
        ggdParams(block, fits[i].shape, fits[i].left, fits[i].right);
      }
      writeFeatures(fits, featuresPerScale * scale, row * blockColumns + column, features);
    }
  }
}

}  // namespace pelorin::image_processing
