#include "image_processing/autoenhance/masks/image_masks.h"

#include <algorithm>
#include <optional>
#include <utility>
#include <vector>

#include "image_processing/autoenhance/lightness/lightness_row.h"
#include "image_processing/autoenhance/masks/bilateral_filter.h"
#include "image_processing/autoenhance/masks/bilateral_grid.h"
#include "image_processing/autoenhance/masks/face_blend_rows.h"
#include "image_processing/autoenhance/masks/flatness_mask.h"
#include "image_processing/autoenhance/masks/grid_blur.h"
#include "image_processing/autoenhance/masks/mask_rows.h"
#include "image_processing/autoenhance/masks/spatial_extent.h"
#include "image_processing/autoenhance/photo_analysis.h"
#include "image_processing/core/stages.h"

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
  const FaceBlendRows faces(metadata, photo.width, photo.height);
  FaceBlendRows::Scratch scratch;
  for (std::uint32_t y = 0; y < photo.height; ++y)
    faces.blendRow(y, photo.row(y), mask.row(y), scratch);
}

/// Through the exact filter.
template <typename TB, typename TL>
void computeMasksExactly(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                         const FilterConfig& config, Image<TB>& bilateral, Image<TL>& ltm,
                         Workers* workers) {
  Image<float> lightness(photo.width, photo.height);
  LightnessRow row(photo.width);
  for (std::uint32_t y = 0; y < photo.height; ++y) {
    std::copy_n(row.of(photo.row(y)), photo.width, lightness.row(y));
  }
  bilateralFilter(lightness, config.bilateralRange,
                  truncateTo<std::int32_t>(spatialExtent(photo.width, photo.height, config)),
                  bilateral, workers);
  computeLtmMask(metadata, photo, lightness, bilateral, config.ltmMaskAmount, config.ltmMaskRadius,
                 ltm);
}

/// @returns the statistics where they were found on the way.
template <typename TB, typename TL>
std::optional<ImageStatistics> computeMasks(const Image<RGBA8Pixel>& photo,
                                            const ImageMetadata& metadata,
                                            const FilterConfig& config, ImageMasks<TB, TL>& masks,
                                            Workers* workers) {
  allocateImageMasks(photo, masks);
  if (config.detailGainHigh == 0.0f) return std::nullopt;
  std::optional<ImageStatistics> statistics;
  if (config.useBilateralGrid == 0) {
    computeMasksExactly(photo, metadata, config, *masks.bilateralMask, *masks.ltmMask, workers);
  } else if (photo.pixelCount() > 0) {
    statistics =
        computeMasksByGrid(photo, metadata, config, *masks.bilateralMask, *masks.ltmMask, workers);
  }
  masks.unwritten = nullptr;
  return statistics;
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
ImageStatistics computeMasksByGrid(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                                   const FilterConfig& config, Image<TB>& bilateral, Image<TL>& ltm,
                                   Workers* workers) {
  const float cellSize = gridCellSize(spatialExtent(photo.width, photo.height, config));
  Grid grid = makeGrid(photo.width, photo.height, cellSize);
  const ImageStatistics statistics = *analysePhoto(
      {photo.width, photo.height, metadata, &grid, cellSize}, photo.data.get(), workers);
  blur(grid, config.bilateralRange, workers);

  using Rows = MaskRows<TB, TL>;
  const std::size_t parts = tasksFor(workers);
  // Of which a band consists.
  const std::int64_t steps =
      parts == 1 ? 1 : sharedBandHeight(photo.width, photo.height) / sumRowsAtOnce;
  Rows rows(
      grid, cellSize, photo.width, photo.height, config, metadata,
      [&](std::uint32_t y) { return photo.row(y); }, RowRing<TB>(bilateral),
      static_cast<int>(steps * bandsUnderWay(3, workers)));
  std::vector<typename Rows::Scratch> preparing;
  for (std::size_t i = 0; i < parts; ++i) preparing.emplace_back(rows);
  LightnessRow summing(photo.width);
  std::vector<FaceBlendRows::Scratch> finishing(parts);

  const auto stepEnd = [&](std::int64_t band) {
    return std::min((band + 1) * steps, rows.steps());
  };
  const auto rowEnd = [&](std::int64_t band) {
    return band < 0 ? 0 : rows.maskEnd(stepEnd(band) - 1);
  };
  const Stage prepare = {parts, [&](std::int64_t band, std::size_t part) {
                           auto step = band * steps + static_cast<std::int64_t>(part);
                           for (; step < stepEnd(band); step += parts)
                             rows.prepare(step, preparing[part]);
                         }};
  const Stage sum = {1, [&](std::int64_t band, std::size_t) {
                       for (std::int64_t step = band * steps; step < stepEnd(band); ++step)
                         rows.sum(step, summing);
                     }};
  const Stage finish = {parts, [&](std::int64_t band, std::size_t part) {
                          const std::uint32_t before = rowEnd(band - 1);
                          const std::uint64_t count = rowEnd(band) - before;
                          auto i = static_cast<std::uint32_t>(partStart(count, part, parts));
                          for (; i < partStart(count, part + 1, parts); ++i)
                            rows.writeLtm(before + i, ltm.row(before + i), finishing[part]);
                        }};
  runStages((rows.steps() + steps - 1) / steps, {prepare, sum, finish}, workers);
  return statistics;
}

template <typename TB, typename TL>
void computeImageMasks(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                       const FilterConfig& config, ImageMasks<TB, TL>& masks) {
  computeMasks(photo, metadata, config, masks, nullptr);
}

template <typename TB, typename TL>
void prepareImage(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                  const FilterConfig& config, ImageStatistics& statistics,
                  ImageMasks<TB, TL>& masks, Workers* workers) {
  std::optional<ImageStatistics> found = computeMasks(photo, metadata, config, masks, workers);
  if (!found) found = analysePhoto(photo, metadata, workers);
  statistics = std::move(*found);
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
template ImageStatistics computeMasksByGrid(const Image<RGBA8Pixel>&, const ImageMetadata&,
                                            const FilterConfig&, Image<float>&, Image<float>&,
                                            Workers*);
template ImageStatistics computeMasksByGrid(const Image<RGBA8Pixel>&, const ImageMetadata&,
                                            const FilterConfig&, Image<Quantized>&,
                                            Image<Quantized>&, Workers*);
template void computeImageMasks(const Image<RGBA8Pixel>&, const ImageMetadata&, const FilterConfig&,
                                ImageMasks<float, float>&);
template void computeImageMasks(const Image<RGBA8Pixel>&, const ImageMetadata&, const FilterConfig&,
                                ImageMasks<Quantized, Quantized>&);
template void prepareImage(const Image<RGBA8Pixel>&, const ImageMetadata&, const FilterConfig&,
                           ImageStatistics&, ImageMasks<float, float>&, Workers*);
template void prepareImage(const Image<RGBA8Pixel>&, const ImageMetadata&, const FilterConfig&,
                           ImageStatistics&, ImageMasks<Quantized, Quantized>&, Workers*);
template void computeLtmMask(const ImageMetadata&, const Image<RGBA8Pixel>&, const Image<float>&,
                             const Image<float>&, float, int, Image<float>&);
template void computeLtmMask(const ImageMetadata&, const Image<RGBA8Pixel>&, const Image<float>&,
                             const Image<Quantized>&, float, int, Image<Quantized>&);

}  // namespace pelorin::image_processing
