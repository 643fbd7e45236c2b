#include "image_processing/autoenhance/masks/image_masks.h"

#include <algorithm>

#include "image_processing/autoenhance/lightness/lightness_histogram.h"
#include "image_processing/autoenhance/lightness/lightness_rows.h"
#include "image_processing/autoenhance/masks/bilateral_filter.h"
#include "image_processing/autoenhance/masks/bilateral_grid.h"
#include "image_processing/autoenhance/masks/face_blend_rows.h"
#include "image_processing/autoenhance/masks/flatness_mask.h"
#include "image_processing/autoenhance/masks/grid_blur.h"
#include "image_processing/autoenhance/masks/grid_splat.h"

namespace pelorin::image_processing {
namespace {

using Quantized = QuantizedFloat<unsigned char>;

template <typename T>
void fillWithZero(Image<T>& mask) {
  T zero;
  zero = 0.0f;
  mask.set(zero);
}

float spatialExtent(const Image<RGBA8Pixel>& photo, const FilterConfig& config) {
  const float shorterSide = static_cast<float>(std::min(photo.width, photo.height));
  const float extent = shorterSide * config.bilateralSpatialFraction;
  return extent > 1.0f ? extent : 1.0f;
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
  LightnessRows rows(photo);
  for (std::uint32_t y = 0; y < photo.height; ++y) {
    std::copy_n(rows.row(y), photo.width, lightness.row(y));
  }
  bilateralFilter(lightness, config.bilateralRange,
                  truncateTo<std::int32_t>(spatialExtent(photo, config)), bilateral);
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
  LightnessRows lightness(photo);
  const float cellSize = gridCellSize(spatialExtent(photo, config));
  Grid grid = makeGrid(photo.width, photo.height, cellSize);
  GridSplatter splatter(grid, photo.width, cellSize);
  for (std::uint32_t y = 0; y < photo.height; ++y) {
    const float* const row = lightness.row(y);
    splatter.addRow(y, row);
    counter.add(row, photo.width);
  }
  blur(grid, config.bilateralRange);

  SmoothedRows<TB> smoothed(grid, cellSize, lightness, bilateral);
  if (config.ltmMaskAmount > 0.0f) {
    computeFlatnessMask<TB, TL>(lightness, smoothed, config.ltmMaskRadius, ltm);
  } else {
    fillWithZero(ltm);
  }
  smoothed.makeUpTo(photo.height);
  blendFacesIntoMask(metadata, photo, ltm);
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
