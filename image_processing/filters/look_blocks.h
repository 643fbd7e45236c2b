#pragma once

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>

#include "image_processing/core/image.h"
#include "image_processing/filters/vignette_rows.h"

namespace pelorin::image_processing {

constexpr std::size_t lookBlock = 256;

/// Cuts the pixels that both images have into pieces of at most `lookBlock` pixels of one row and
/// calls `block(from, to, count, samples)` for each; `samples` are the indices of the mask samples
/// when there are `rows`, otherwise of no meaning.
template <typename Block>
void forEachLookBlock(const Image<RGBA8Pixel>& source, Image<RGBA8Pixel>& output,
                      VignetteRows* rows, Block block) {
  std::array<std::int32_t, lookBlock> samples;
  std::size_t left = std::min(source.pixelCount(), output.pixelCount());
  const RGBA8Pixel* from = source.data.get();
  RGBA8Pixel* to = output.data.get();
  while (left > 0) {
    const std::size_t inRow = std::min<std::size_t>(source.width, left);
    for (std::size_t x = 0; x < inRow; x += lookBlock) {
      const std::size_t count = std::min(lookBlock, inRow - x);
      if (rows != nullptr) rows->indices(x, count, samples.data());
      block(from + x, to + x, count, samples.data());
    }
    if (rows != nullptr) rows->advanceToNextRow();
    from += inRow;
    to += inRow;
    left -= inRow;
  }
}

}  // namespace pelorin::image_processing
