#pragma once

#include <array>
#include <cstdint>

#include "image_processing/core/image.h"
#include "image_processing/quality/ggd.h"

namespace pelorin::image_processing {

/// Writes the 18 features of one block, from the fits in the order of `niqeShifts`, into a column
/// of the feature image from `firstRow` on.
inline void writeFeatures(const std::array<Ggd, 5>& fits, std::uint32_t firstRow,
                          std::uint32_t column, Image<float>& features) {
  features.row(firstRow)[column] = fits[0].shape;
  features.row(firstRow + 1)[column] = (fits[0].left + fits[0].right) * 0.5f;
  for (std::uint32_t neighbour = 1; neighbour < fits.size(); ++neighbour) {
    const Ggd& fit = fits[neighbour];
    const std::uint32_t row = firstRow + 4 * neighbour - 2;
    features.row(row)[column] = fit.shape;
    features.row(row + 1)[column] = ggdMean(fit);
    features.row(row + 2)[column] = fit.left;
    features.row(row + 3)[column] = fit.right;
  }
}

}  // namespace pelorin::image_processing
