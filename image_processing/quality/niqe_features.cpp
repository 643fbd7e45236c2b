#include "image_processing/quality/niqe_features.h"

#include <algorithm>

#include "image_processing/quality/im_halve.h"
#include "image_processing/quality/image_structure.h"
#include "image_processing/quality/niqe_grey.h"
#include "image_processing/quality/niqe_model.h"

namespace pelorin::image_processing {
namespace {

// How far from a block its features look: three pixels of the half.
constexpr std::uint32_t reach = 6;

// Rows `first` to `first` + `height` of an image, sharing its pixels.
template <typename T>
Image<T> rowsOf(const Image<T>& image, std::uint32_t first, std::uint32_t height) {
  return {image.width, height, std::shared_ptr<T>(image.data, image.row(first))};
}

}  // namespace

Image<float> niqeFeaturesScalar(const Image<RGBA8Pixel>& image) {
  std::uint32_t width = image.width, height = image.height;
  const std::uint32_t blockColumns = width / niqeBlockSize, blockRows = height / niqeBlockSize;
  Image<float> grey(width, height), structure(width, height);
  Image<float> features(blockColumns * blockRows, niqeFeatureCount);

  niqeGreyScalar(image.data.get(), grey.data.get(), image.pixelCount());
  for (std::uint32_t scale = 0; scale < 2; ++scale) {
    if (scale > 0) imHalveScalar(grey, width, height);
    computeImageStructure(grey, width, height, structure);
    computeBlockFeaturesScalar(structure, niqeFeaturesPerScale, niqeBlockSize, blockColumns,
                               blockRows, scale, features);
  }
  return features;
}

// The same steps for one row of blocks at a time, with the rows around it that its features see.
// Two whole float images would cost more time in page faults than in arithmetic.
Image<float> niqeFeatures(const Image<RGBA8Pixel>& image) {
  const std::uint32_t blockColumns = image.width / niqeBlockSize;
  const std::uint32_t blockRows = image.height / niqeBlockSize;
  Image<float> features(blockColumns * blockRows, niqeFeatureCount);
  Image<float> rowFeatures(blockColumns, niqeFeatureCount);
  Image<float> grey(image.width, reach + niqeBlockSize + reach);
  Image<float> structure(grey.width, grey.height);

  for (std::uint32_t blockRow = 0; blockRow < blockRows; ++blockRow) {
    const std::uint32_t top = blockRow * niqeBlockSize;
    const std::uint32_t above = std::min(top, reach);
    const std::uint32_t below = std::min(image.height - top - niqeBlockSize, reach);
    std::uint32_t width = image.width, height = above + niqeBlockSize + below;

    niqeGrey(image.row(top - above), grey.data.get(), std::size_t{width} * height);
    for (std::uint32_t scale = 0; scale < 2; ++scale) {
      if (scale > 0) imHalve(grey, width, height);
      computeImageStructure_fast(grey, width, height, structure);
      computeBlockFeatures(rowsOf(structure, above / (scale + 1), niqeBlockSize / (scale + 1)),
                           niqeFeaturesPerScale, niqeBlockSize, blockColumns, 1, scale,
                           rowFeatures);
    }
    for (std::uint32_t feature = 0; feature < niqeFeatureCount; ++feature)
      std::copy_n(rowFeatures.row(feature), blockColumns,
                  features.row(feature) + blockRow * blockColumns);
  }
  return features;
}

}  // namespace pelorin::image_processing
