#pragma once

#include <cstdint>
#include <vector>

#include "image_processing/core/export.h"
#include "image_processing/core/image.h"
#include "image_processing/core/rows.h"

namespace pelorin::image_processing {

// How natural a photo looks, without a reference: the NIQE score of Mittal, Soundararajan and
// Bovik, "Making a Completely Blind Image Quality Analyzer" (2013). Lower is better. Scores compare
// only under the same model. Pure functions, for any thread; alpha is ignored.

/// Names the model of pristine photos that scores refer to; changes with any of its values.
inline constexpr char niqeModelId[] = "niqe-pristine-1";

/// The score of a picture; NaN when it is narrower or lower than 96 pixels. A picture with nothing
/// to see, every pixel the same, scores about 28.6.
/// @param image  not modified.
/// @throws std::bad_alloc for about 220 of its rows as floats.
PELORIN_EXPORT float niqeMetric(Image<RGBA8Pixel>& image);

/// A score and what it is made of.
struct NiqeAnalysis {
  /// As `niqeMetric`.
  float score;
  /// Blocks of 96 x 96 pixels from the top left of the picture; 0 when it is too small.
  std::uint32_t blockColumns, blockRows;
  /// The 36 mean features that are scored; empty when the picture is too small.
  std::vector<float> meanFeatures;
  /// A column a block, in raster order; 36 rows of features, NaN where one could not be had.
  Image<float> blockFeatures;
  /// What each block alone would score, in raster order.
  std::vector<float> blockDistances;
};

/// @throws std::bad_alloc.
NiqeAnalysis analyzeNiqe(const Image<RGBA8Pixel>& image);

/// The same of a picture that comes as rows, of which about a hundred are held. All are read, even
/// if it is too small.
/// @throws what the source throws as well.
NiqeAnalysis analyzeNiqe(std::uint32_t width, std::uint32_t height, RowSource& rows);

}  // namespace pelorin::image_processing
