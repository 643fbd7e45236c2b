#include "image_processing/autoenhance/enhance_rows.h"

#include <algorithm>
#include <optional>
#include <vector>

#include "image_processing/autoenhance/colour/lab_constants.h"
#include "image_processing/autoenhance/enhance_row.h"
#include "image_processing/autoenhance/lightness/build_tone_curve.h"
#include "image_processing/autoenhance/masks/bilateral_grid.h"
#include "image_processing/autoenhance/masks/grid_blur.h"
#include "image_processing/autoenhance/masks/mask_rows.h"
#include "image_processing/autoenhance/masks/spatial_extent.h"
#include "image_processing/autoenhance/photo_analysis.h"
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

  /// Sees to it that all rows below `end` were read.
  void readUpTo(std::uint32_t end) {
    while (read_ < end) {
      const std::uint32_t count = std::min(band_, height_ - read_);
      const RGBA8Pixel* const rows = source_.next(count, room_.row(read_ % room_.height));
      for (std::uint32_t i = 0; i < count; ++i) {
        rows_[(read_ + i) % rows_.size()] = rows + std::size_t{i} * width_;
      }
      read_ += count;
    }
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
    AnalysisSubject subject{width_, height_, metadata_};
    if (masked_) {
      subject.cellSize = cellSize_ = gridCellSize(spatialExtent(width_, height_, config_));
      subject.grid = &grid_.emplace(makeGrid(width_, height_, cellSize_));
    }
    const std::optional<ImageStatistics> statistics = analysePhoto(subject, rows, work);
    if (!statistics) return false;
    statistics_ = *statistics;
    if (grid_) blur(*grid_, config_.bilateralRange, work.workers);
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
    Workers* const workers = work.workers;
    const std::size_t parts = tasksFor(workers);
    const int steps =
        parts == 1 ? 1 : std::max(1, static_cast<int>(work.bandHeight / sumRowsAtOnce));
    // The steps that may be under way from one stage to another, those stages' own included.
    const auto stepsOver = [&](std::size_t stages) {
      return steps * static_cast<int>(bandsUnderWay(stages, workers));
    };
    RecentRows photo(rows, width_, height_, Masks::rowsHeld(height_, config_, stepsOver(4)),
                     work.bandHeight);
    Masks masks(
        *grid_, cellSize_, width_, height_, config_, metadata_,
        [&](std::uint32_t y) { return photo.row(y); },
        RowRing<Mask>(width_, Masks::rowsHeld(height_, config_, stepsOver(3))), stepsOver(3));
    std::vector<typename Masks::Scratch> preparing;
    for (std::size_t i = 0; i < std::min<std::size_t>(parts, steps); ++i)
      preparing.emplace_back(masks);
    LightnessRow summing(width_);
    std::vector<Finishing> finishing;
    for (std::size_t i = 0; i < parts; ++i) finishing.emplace_back(width_);
    std::vector<Image<RGBA8Pixel>> made;
    for (std::int64_t i = bandsUnderWay(2, workers); i > 0; --i)
      made.emplace_back(width_, static_cast<std::uint32_t>(steps * sumRowsAtOnce));

    const std::int64_t bands = (masks.steps() + steps - 1) / steps;
    const auto stepEnd = [&](std::int64_t band) {
      return std::min((band + 1) * steps, masks.steps());
    };
    const auto rowEnd = [&](std::int64_t band) {
      return band < 0 ? 0 : masks.maskEnd(stepEnd(band) - 1);
    };
    const auto rowsOf = [&](std::int64_t band) { return rowEnd(band) - rowEnd(band - 1); };
    const auto roomOf = [&](std::int64_t band) -> const Image<RGBA8Pixel>& {
      return made[static_cast<std::size_t>(band) % made.size()];
    };
    const Stage read = {1, [&](std::int64_t band, std::size_t) {
                          photo.readUpTo(masks.photoEnd(stepEnd(band) - 1));
                        }};
    const Stage prepare = {preparing.size(), [&](std::int64_t band, std::size_t part) {
                             auto step = band * steps + static_cast<std::int64_t>(part);
                             for (; step < stepEnd(band); step += preparing.size())
                               masks.prepare(step, preparing[part]);
                           }};
    const Stage sum = {1, [&](std::int64_t band, std::size_t) {
                         for (std::int64_t step = band * steps; step < stepEnd(band); ++step)
                           masks.sum(step, summing);
                       }};
    const Stage enhance = {parts, [&](std::int64_t band, std::size_t part) {
                             const std::uint32_t before = rowEnd(band - 1), count = rowsOf(band);
                             Mask* const ltm = finishing[part].ltm.data.get();
                             auto i = static_cast<std::uint32_t>(partStart(count, part, parts));
                             for (; i < partStart(count, part + 1, parts); ++i) {
                               const std::uint32_t y = before + i;
                               masks.writeLtm(y, ltm, finishing[part].faces);
                               pass.enhance(photo.row(y), masks.bilateral(y), ltm,
                                            roomOf(band).row(i), width_);
                             }
                           }};
    const Stage write = {1, [&](std::int64_t band, std::size_t) {
                           if (rowsOf(band) > 0)
                             filtered.write(roomOf(band).data.get(), rowsOf(band));
                         }};
    return runStages(bands, {read, prepare, sum, enhance, write}, workers, work.stop);
  }

  /// What a task works with that finishes rows.
  struct Finishing {
    explicit Finishing(std::uint32_t width) : ltm(width, 1) {}
    Image<Mask> ltm;
    FaceBlendRows::Scratch faces;
  };

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
