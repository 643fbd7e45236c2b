#include "image_processing/autoenhance/masks/mask_rows.h"

#include <algorithm>
#include <utility>

namespace pelorin::image_processing {
namespace {

constexpr std::int64_t stepRows = sumRowsAtOnce;

bool hasFlatness(const FilterConfig& config) {
  return config.ltmMaskAmount > 0.0f && config.ltmMaskRadius >= 0;
}

}  // namespace

template <typename TB, typename TL>
MaskRows<TB, TL>::MaskRows(const Grid& grid, float cellSize, std::uint32_t width,
                           std::uint32_t height, const FilterConfig& config,
                           const ImageMetadata& metadata, PhotoRow photo, RowRing<TB> bilateral,
                           int stepsAtOnce)
    : grid_(grid),
      cellSize_(cellSize),
      width_(width),
      height_(height),
      photo_(std::move(photo)),
      bilateral_(std::move(bilateral)),
      faces_(metadata, width, height) {
  if (hasFlatness(config)) table_.emplace(width, height, config.ltmMaskRadius, stepsAtOnce);
}

template <typename TB, typename TL>
std::uint32_t MaskRows<TB, TL>::rowsHeld(std::uint32_t height, const FilterConfig& config,
                                         int stepsAtOnce) {
  // A row is in use from when the window of a row above reaches it until it is finished itself.
  const std::int64_t reach = hasFlatness(config) ? std::int64_t{config.ltmMaskRadius} + 1 : 0;
  return static_cast<std::uint32_t>(std::min<std::int64_t>(height, reach + stepsAtOnce * stepRows));
}

template <typename TB, typename TL>
std::int64_t MaskRows<TB, TL>::steps() const {
  const std::int64_t rows = table_ ? table_->height() : std::int64_t{height_};
  return (rows + stepRows - 1) / stepRows;
}

template <typename TB, typename TL>
std::uint32_t MaskRows<TB, TL>::photoEnd(std::int64_t step) const {
  const std::int64_t end = (step + 1) * stepRows;
  return table_ ? table_->sourceEnd(end)
                : static_cast<std::uint32_t>(std::min<std::int64_t>(end, height_));
}

template <typename TB, typename TL>
std::uint32_t MaskRows<TB, TL>::maskEnd(std::int64_t step) const {
  return table_ ? table_->shapedEnd(std::min((step + 1) * stepRows, table_->height()))
                : photoEnd(step);
}

template <typename TB, typename TL>
const TB* MaskRows<TB, TL>::smooth(std::uint32_t y, const float* lightness, Scratch& scratch) {
  TB* const smoothed = bilateral_.row(y);
  scratch.slicer.sliceRow(y, lightness, smoothed);
  return smoothed;
}

// Near the borders several rows of the table are made of one row of the photo. The first of them is
// prepared; the others follow when sums are formed, since then the smoothing is there.
template <typename TB, typename TL>
template <typename Visit>
void MaskRows<TB, TL>::forEachTableRow(std::int64_t step, bool first, Visit visit) const {
  const std::int64_t end = std::min((step + 1) * stepRows, table_->height());
  for (std::int64_t i = step * stepRows; i < end; ++i) {
    const std::uint32_t source = table_->sourceOf(i);
    if ((table_->firstOf(source) == i) == first) visit(i, source);
  }
}

template <typename TB, typename TL>
void MaskRows<TB, TL>::prepare(std::int64_t step, Scratch& scratch) {
  if (!table_) {
    for (std::uint32_t y = step == 0 ? 0 : photoEnd(step - 1); y < photoEnd(step); ++y) {
      smooth(y, scratch.lightness.of(photo_(y)), scratch);
    }
    return;
  }
  forEachTableRow(step, /*first=*/true, [&](std::int64_t i, std::uint32_t source) {
    const float* const lightness = scratch.lightness.of(photo_(source));
    table_->weigh(i, lightness, smooth(source, lightness, scratch));
  });
}

template <typename TB, typename TL>
void MaskRows<TB, TL>::sum(std::int64_t step, LightnessRow& scratch) {
  if (!table_) return;
  forEachTableRow(step, /*first=*/false, [&](std::int64_t i, std::uint32_t source) {
    table_->weigh(i, scratch.of(photo_(source)), bilateral_.row(source));
  });
  table_->sum(step * stepRows);
}

template <typename TB, typename TL>
void MaskRows<TB, TL>::writeLtm(std::uint32_t y, TL* mask, FaceBlendRows::Scratch& scratch) const {
  if (table_) {
    table_->shape(y, mask);
  } else {
    TL none;
    none = 0.0f;
    std::fill_n(mask, width_, none);
  }
  faces_.blendRow(y, photo_(y), mask, scratch);
}

template class MaskRows<float, float>;
template class MaskRows<QuantizedFloat<unsigned char>, QuantizedFloat<unsigned char>>;

}  // namespace pelorin::image_processing
