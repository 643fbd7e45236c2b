#include "image_processing/autoenhance/enhance_rows.h"

#include <algorithm>
#include <optional>
#include <vector>

#include "image_processing/autoenhance/colour/lab_constants.h"
#include "image_processing/autoenhance/enhance_row.h"
#include "image_processing/autoenhance/lightness/build_tone_curve.h"
#include "image_processing/autoenhance/lightness/face_lightness.h"
#include "image_processing/autoenhance/lightness/image_statistics.h"
#include "image_processing/autoenhance/lightness/lightness_histogram.h"
#include "image_processing/autoenhance/lightness/lightness_row.h"
#include "image_processing/autoenhance/masks/bilateral_grid.h"
#include "image_processing/autoenhance/masks/grid_blur.h"
#include "image_processing/autoenhance/masks/grid_splat.h"
#include "image_processing/autoenhance/masks/mask_rows.h"
#include "image_processing/autoenhance/masks/spatial_extent.h"
#include "image_processing/core/parameter_strings.h"
#include "image_processing/filters/mapped_rows.h"

namespace pelorin::image_processing {
namespace {

/// The latest rows of a source, where they stand.
class RecentRows {
 public:
  /// @param held  rows that stay.
  RecentRows(RowSource& source, std::uint32_t width, std::uint32_t height, std::uint32_t held,
             std::uint32_t band)
      : source_(source),
        width_(width),
        height_(height),
        band_(std::min(band, height)),
        // Whole bands, so that none is cut by the end of the room.
        room_(width, (held + 2 * band_ - 2) / band_ * band_),
        rows_(room_.height) {}

  /// Sees to it that all rows below `end` were read. @returns false when the work gave up.
  bool readUpTo(std::uint32_t end, const RowWork& work) {
    while (read_ < end) {
      if (shallStop(work)) return false;
      const std::uint32_t count = std::min(band_, height_ - read_);
      const RGBA8Pixel* const rows = source_.next(count, room_.row(read_ % room_.height));
      for (std::uint32_t i = 0; i < count; ++i) {
        rows_[(read_ + i) % rows_.size()] = rows + std::size_t{i} * width_;
      }
      read_ += count;
    }
    return true;
  }

  const RGBA8Pixel* row(std::uint32_t y) const { return rows_[y % rows_.size()]; }

 private:
  RowSource& source_;
  std::uint32_t width_, height_, band_;
  Image<RGBA8Pixel> room_;
  std::vector<const RGBA8Pixel*> rows_;
  std::uint32_t read_ = 0;
};

template <typename Mask>
class EnhanceRows : public RowFilter {
 public:
  explicit EnhanceRows(const RowRequest& request)
      : width_(request.width),
        height_(request.height),
        metadata_(request.metadata),
        config_(request.config) {
    const FilterParams options(request.params);
    updateFilterConfigForSliderValue(options.readFloat("slider"), &config_);
    masked_ =
        !options.readBool("gtmOnly") && config_.detailGainHigh != 0.0f && width_ > 0 && height_ > 0;
  }

  bool looksFirst() const override { return true; }

  bool look(RowSource& rows, const RowWork& work) override {
    LightnessHistogramSimd counter;
    FaceLightness faces(metadata_, width_, height_, lightnessBins, lightnessScale);
    LightnessRow lightness(width_);
    std::optional<GridSplatter> splatter;
    if (masked_) {
      cellSize_ = gridCellSize(spatialExtent(width_, height_, config_));
      grid_.emplace(makeGrid(width_, height_, cellSize_));
      splatter.emplace(*grid_, width_, cellSize_);
    }
    const std::uint32_t band = std::min(work.bandHeight, height_);
    const Image<RGBA8Pixel> room(width_, band);
    for (std::uint32_t y = 0; y < height_;) {
      if (shallStop(work)) return false;
      const std::uint32_t end = std::min(y + band, height_);
      const RGBA8Pixel* pixels = rows.next(end - y, room.data.get());
      for (; y < end; ++y, pixels += width_) {
        const float* const row = lightness.of(pixels);
        if (splatter) splatter->addRow(y, row);
        counter.add(row, width_);
        faces.addRow(pixels);
      }
    }
    if (grid_) blur(*grid_, config_.bilateralRange);
    statistics_ = analyzeImage(counter, faces);
    return true;
  }

  bool filter(RowSource& rows, RowSink& filtered, const RowWork& work) override {
    const TonePass pass(buildToneCurve(statistics_, config_), labWhite, config_.vibrance,
                        config_.ltmBlend, config_.detailGain);
    const PreparedTonePass prepared(pass);
    if (masked_) return filterWithMasks(prepared, rows, filtered, work);
    constexpr const Mask* none = nullptr;
    return mapRows(width_, height_, rows, filtered, work,
                   [&](std::uint32_t, const RGBA8Pixel* from, RGBA8Pixel* to,
                       std::size_t count) -> const RGBA8Pixel* {
                     prepared.enhance(from, none, none, to, count);
                     return to;
                   });
  }

 private:
  bool filterWithMasks(const PreparedTonePass& pass, RowSource& rows, RowSink& filtered,
                       const RowWork& work) {
    using Masks = MaskRows<Mask, Mask>;
    const std::uint32_t held = Masks::rowsHeld(height_, config_);
    RecentRows photo(rows, width_, height_, held, work.bandHeight);
    Masks masks(
        *grid_, cellSize_, width_, height_, config_, metadata_,
        [&](std::uint32_t y) { return photo.row(y); }, RowRing<Mask>(width_, held));
    typename Masks::Scratch scratch(masks);
    const Image<Mask> ltm(width_, 1);
    const Image<RGBA8Pixel> made(width_, sumRowsAtOnce);
    std::uint32_t y = 0;
    for (std::int64_t step = 0; step < masks.steps(); ++step) {
      if (!photo.readUpTo(masks.photoEnd(step), work)) return false;
      masks.prepare(step, scratch);
      masks.sum(step, scratch);
      const std::uint32_t first = y;
      for (; y < masks.maskEnd(step); ++y) {
        masks.writeLtm(y, ltm.data.get());
        pass.enhance(photo.row(y), masks.bilateral(y), ltm.data.get(), made.row(y - first), width_);
      }
      if (y > first) filtered.write(made.data.get(), y - first);
    }
    return true;
  }

  std::uint32_t width_, height_;
  ImageMetadata metadata_;
  FilterConfig config_;
  bool masked_;
  float cellSize_ = 0.0f;
  std::optional<Grid> grid_;
  ImageStatistics statistics_;
};

}  // namespace

template <typename Mask>
std::unique_ptr<RowFilter> enhanceRowFilter(const RowRequest& request) {
  return std::make_unique<EnhanceRows<Mask>>(request);
}

template std::unique_ptr<RowFilter> enhanceRowFilter<float>(const RowRequest&);
template std::unique_ptr<RowFilter> enhanceRowFilter<QuantizedFloat<unsigned char>>(
    const RowRequest&);

}  // namespace pelorin::image_processing
