#include "image_processing/quality/niqe.h"

#include <limits>

#include "image_processing/core/picture_rows.h"
#include "image_processing/quality/niqe_features.h"
#include "image_processing/quality/quality_score.h"

namespace pelorin::image_processing {
namespace {

constexpr float nan = std::numeric_limits<float>::quiet_NaN();

std::vector<float> scoreBlocks(const Image<float>& features) {
  std::vector<float> distances, blockMeans;
  Image<float> block(1, features.height);
  for (std::uint32_t k = 0; k < features.width; ++k) {
    for (std::uint32_t row = 0; row < features.height; ++row)
      *block.row(row) = features.row(row)[k];
    mean(block, blockMeans);
    distances.push_back(computeQuality(blockMeans));
  }
  return distances;
}

}  // namespace

float niqeMetric(Image<RGBA8Pixel>& image) {
  if (!isScorable(image)) return nan;
  std::vector<float> meanFeatures;
  mean(niqeFeatures(image), meanFeatures);
  return computeQuality(meanFeatures);
}

NiqeAnalysis analyzeNiqe(const Image<RGBA8Pixel>& image) {
  PictureSource rows(image);
  return analyzeNiqe(image.width, image.height, rows);
}

NiqeAnalysis analyzeNiqe(std::uint32_t width, std::uint32_t height, RowSource& rows) {
  if (!isScorable(width, height)) {
    const Image<RGBA8Pixel> room(width, 1);
    for (std::uint32_t y = 0; y < height; ++y) rows.next(1, room.data.get());
    return {nan, 0, 0, {}, Image<float>(0, 0), {}};
  }
  NiqeAnalysis analysis = {nan,
                           width / niqeBlockSize,
                           height / niqeBlockSize,
                           {},
                           niqeFeaturesOfRows(width, height, rows),
                           {}};
  mean(analysis.blockFeatures, analysis.meanFeatures);
  analysis.score = computeQuality(analysis.meanFeatures);
  analysis.blockDistances = scoreBlocks(analysis.blockFeatures);
  return analysis;
}

}  // namespace pelorin::image_processing
