#include "image_processing/quality/niqe_features.h"

#include <algorithm>

#include "image_processing/core/picture_rows.h"
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

namespace {

// Rows of a source that are looked at together, where they stand back to back.
class Window {
 public:
  Window(RowSource& source, std::uint32_t width, std::uint32_t held)
      : source_(source),
        standing_(source.standing()),
        width_(width),
        room_(standing_ == nullptr ? width : 0, held) {}

  /// Rows from `first` to before `end`; neither is less than it was.
  const RGBA8Pixel* rows(std::uint32_t first, std::uint32_t end) {
    if (standing_ != nullptr) return standing_ + std::size_t{width_} * first;
    std::copy(room_.row(first - first_), room_.row(end_ - first_), room_.data.get());
    RGBA8Pixel* const room = room_.row(end_ - first);
    const RGBA8Pixel* const next = source_.next(end - end_, room);
    if (next != room) std::copy_n(next, std::size_t{width_} * (end - end_), room);
    first_ = first;
    end_ = end;
    return room_.data.get();
  }

 private:
  RowSource& source_;
  const RGBA8Pixel* const standing_;
  std::uint32_t width_;
  Image<RGBA8Pixel> room_;
  std::uint32_t first_ = 0, end_ = 0;  // what is in the room
};

}  // namespace

Image<float> niqeFeatures(const Image<RGBA8Pixel>& image) {
  PictureSource rows(image);
  return niqeFeaturesOfRows(image.width, image.height, rows);
}

// The same steps for one row of blocks at a time, with the rows around it that its features see.
// Two whole float images would cost more time in page faults than in arithmetic.
Image<float> niqeFeaturesOfRows(std::uint32_t imageWidth, std::uint32_t imageHeight,
                                RowSource& rows) {
  const std::uint32_t blockColumns = imageWidth / niqeBlockSize;
  const std::uint32_t blockRows = imageHeight / niqeBlockSize;
  Image<float> features(blockColumns * blockRows, niqeFeatureCount);
  Image<float> rowFeatures(blockColumns, niqeFeatureCount);
  Image<float> grey(imageWidth, reach + niqeBlockSize + reach);
  Window window(rows, imageWidth, grey.height);
  Image<float> structure(grey.width, grey.height);

  for (std::uint32_t blockRow = 0; blockRow < blockRows; ++blockRow) {
    const std::uint32_t top = blockRow * niqeBlockSize;
    const std::uint32_t above = std::min(top, reach);
    const std::uint32_t below = std::min(imageHeight - top - niqeBlockSize, reach);
    std::uint32_t width = imageWidth, height = above + niqeBlockSize + below;

    niqeGrey(window.rows(top - above, top + niqeBlockSize + below), grey.data.get(),
             std::size_t{width} * height);
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
  // The others have no block, yet whether a photo is whole is known behind its last row.
  for (std::uint32_t y = blockRows * niqeBlockSize + reach; y < imageHeight; ++y)
    window.rows(y, y + 1);
  return features;
}

}  // namespace pelorin::image_processing
