#include "image_processing/autoenhance/masks/image_masks.h"

#include <algorithm>

#include "image_processing/autoenhance/lightness/lightness_histogram.h"
#include "image_processing/autoenhance/lightness/lightness_row.h"
#include "image_processing/autoenhance/masks/bilateral_filter.h"
#include "image_processing/autoenhance/masks/bilateral_grid.h"
#include "image_processing/autoenhance/masks/face_blend_rows.h"
#include "image_processing/autoenhance/masks/flatness_mask.h"
#include "image_processing/autoenhance/masks/grid_blur.h"
#include "image_processing/autoenhance/masks/grid_splat.h"
#include "image_processing/autoenhance/masks/mask_rows.h"
#include "image_processing/autoenhance/masks/spatial_extent.h"

namespace pelorin::image_processing {
namespace {

using Quantized = QuantizedFloat<unsigned char>;

template <typename T>
void fillWithZero(Image<T>& mask) {
  T zero;
  zero = 0.0f;
  mask.set(zero);
}

template <typename T>
void blendFacesIntoMask(const ImageMetadata& metadata, const Image<RGBA8Pixel>& photo,
                        Image<T>& mask) {
  if (metadata.faces.empty()) return;
  FaceBlendRows faces(metadata, photo.width, photo.height);
  for (std::uint32_t y = 0; y < photo.height; ++y) faces.blendRow(photo.row(y), mask.row(y));
}

/// Through the exact filter.
template <typename TB, typename TL>
void computeMasksExactly(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                         const FilterConfig& config, Image<TB>& bilateral, Image<TL>& ltm) {
  Image<float> lightness(photo.width, photo.height);
  LightnessRow row(photo.width);
  for (std::uint32_t y = 0; y < photo.height; ++y) {
    std::copy_n(row.of(photo.row(y)), photo.width, lightness.row(y));
  }
  bilateralFilter(lightness, config.bilateralRange,
                  truncateTo<std::int32_t>(spatialExtent(photo.width, photo.height, config)),
                  bilateral);
  computeLtmMask(metadata, photo, lightness, bilateral, config.ltmMaskAmount, config.ltmMaskRadius,
                 ltm);
}

/// @returns whether the pixels were counted on the way.
template <typename TB, typename TL>
bool computeMasks(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                  const FilterConfig& config, ImageMasks<TB, TL>& masks,
                  LightnessHistogramSimd& counter) {
  allocateImageMasks(photo, masks);
  if (config.detailGainHigh == 0.0f) return false;
  const bool byGrid = config.useBilateralGrid != 0;
  if (byGrid) {
    computeMasksByGrid(photo, metadata, config, *masks.bilateralMask, *masks.ltmMask, counter);
  } else {
    computeMasksExactly(photo, metadata, config, *masks.bilateralMask, *masks.ltmMask);
  }
  masks.unwritten = nullptr;
  return byGrid;
}

}  // namespace

template <typename TB, typename TL>
void allocateImageMasks(const Image<RGBA8Pixel>& photo, ImageMasks<TB, TL>& masks) {
  masks = {};
  masks.ltmMask = makeSharedImage<TL>(photo.width, photo.height);
  masks.unwritten = masks.ltmMask;
  masks.bilateralMask = makeSharedImage<TB>(photo.width, photo.height);
}

template <typename TB, typename TL>
void computeMasksByGrid(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                        const FilterConfig& config, Image<TB>& bilateral, Image<TL>& ltm,
                        LightnessHistogramSimd& counter) {
  if (photo.pixelCount() == 0) return;
  LightnessRow lightness(photo.width);
  const float cellSize = gridCellSize(spatialExtent(photo.width, photo.height, config));
  Grid grid = makeGrid(photo.width, photo.height, cellSize);
  GridSplatter splatter(grid, photo.width, cellSize);
  for (std::uint32_t y = 0; y < photo.height; ++y) {
    const float* const row = lightness.of(photo.row(y));
    splatter.addRow(y, row);
    counter.add(row, photo.width);
  }
  blur(grid, config.bilateralRange);

  using Rows = MaskRows<TB, TL>;
  Rows rows(
      grid, cellSize, photo.width, photo.height, config, metadata,
      [&](std::uint32_t y) { return photo.row(y); }, RowRing<TB>(bilateral));
  typename Rows::Scratch scratch(rows);
  std::uint32_t y = 0;
  for (std::int64_t step = 0; step < rows.steps(); ++step) {
    rows.prepare(step, scratch);
    rows.sum(step, scratch);
    for (; y < rows.maskEnd(step); ++y) rows.writeLtm(y, ltm.row(y));
  }
}

template <typename TB, typename TL>
void computeImageMasks(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                       const FilterConfig& config, ImageMasks<TB, TL>& masks) {
  LightnessHistogramSimd unused;
  computeMasks(photo, metadata, config, masks, unused);
}

template <typename TB, typename TL>
void prepareImage(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                  const FilterConfig& config, ImageStatistics& statistics,
                  ImageMasks<TB, TL>& masks) {
  LightnessHistogramSimd counter;
  if (computeMasks(photo, metadata, config, masks, counter)) {
    analyzeImage(counter, photo, metadata, statistics);
  } else {
    analyzeImage(photo, metadata, statistics);
  }
}

template <typename TB, typename TL>
void computeLtmMask(const ImageMetadata& metadata, const Image<RGBA8Pixel>& photo,
                    const Image<float>& lightness, const Image<TB>& bilateral, float amount,
                    int radius, Image<TL>& mask) {
  if (amount > 0.0f) {
    computeFlatnessMask(lightness, bilateral, radius, mask);
  } else {
    fillWithZero(mask);
  }
  blendFacesIntoMask(metadata, photo, mask);
}

template void allocateImageMasks(const Image<RGBA8Pixel>&, ImageMasks<float, float>&);
template void allocateImageMasks(const Image<RGBA8Pixel>&, ImageMasks<Quantized, Quantized>&);
template void computeMasksByGrid(const Image<RGBA8Pixel>&, const ImageMetadata&,
                                 const FilterConfig&, Image<float>&, Image<float>&,
                                 LightnessHistogramSimd&);
template void computeMasksByGrid(const Image<RGBA8Pixel>&, const ImageMetadata&,
                                 const FilterConfig&, Image<Quantized>&, Image<Quantized>&,
                                 LightnessHistogramSimd&);
template void computeImageMasks(const Image<RGBA8Pixel>&, const ImageMetadata&, const FilterConfig&,
                                ImageMasks<float, float>&);
template void computeImageMasks(const Image<RGBA8Pixel>&, const ImageMetadata&, const FilterConfig&,
                                ImageMasks<Quantized, Quantized>&);
template void prepareImage(const Image<RGBA8Pixel>&, const ImageMetadata&, const FilterConfig&,
                           ImageStatistics&, ImageMasks<float, float>&);
template void prepareImage(const Image<RGBA8Pixel>&, const ImageMetadata&, const FilterConfig&,
                           ImageStatistics&, ImageMasks<Quantized, Quantized>&);
template void computeLtmMask(const ImageMetadata&, const Image<RGBA8Pixel>&, const Image<float>&,
                             const Image<float>&, float, int, Image<float>&);
template void computeLtmMask(const ImageMetadata&, const Image<RGBA8Pixel>&, const Image<float>&,
                             const Image<Quantized>&, float, int, Image<Quantized>&);

}  // namespace pelorin::image_processing
