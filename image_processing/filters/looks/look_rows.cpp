#include "image_processing/filters/looks/look_rows.h"

#include <algorithm>

namespace pelorin::image_processing {
namespace {

// Filling a table takes about as long as it saves on 400 pixels.
bool tablesPay(const Look& look, std::uint64_t pixels) {
  const std::size_t tables = look.vignette == nullptr ? 1 : look.vignette->samples().size();
  return look.mix == ChannelMix::none && pixels >= 400 * tables;
}

}  // namespace

LookRows::LookRows(const Look& look, std::uint32_t width, std::uint32_t height)
    : look_(look),
      width_(width),
      coordinates_(width, height, look.maskRadius),
      rows_(coordinates_, look.vignette != nullptr ? width : 0,
            look.vignette != nullptr ? height : 0, look.vignette),
      way_(Way::direct) {
  if (look.vignette != nullptr && !VignetteRows::canCover(coordinates_)) {
    way_ = Way::scalar;
  } else if (tablesPay(look, std::uint64_t{width} * height)) {
    way_ = Way::table;
    tables_ = look.vignette != nullptr ? lookTables(look) : std::vector{lookTable(look)};
  } else if (DirectLook::canCompute(look)) {
    direct_.emplace(look);
  } else {
    way_ = Way::scalar;
  }
}

void LookRows::apply(std::uint32_t y, const RGBA8Pixel* from, RGBA8Pixel* to,
                     std::size_t count) const {
  if (look_.vignette == nullptr) return applyToRow(y, from, to, count);
  for (; count > 0; ++y) {
    const std::size_t some = std::min<std::size_t>(count, width_);
    applyToRow(y, from, to, some);
    from += some;
    to += some;
    count -= some;
  }
}

void LookRows::applyToRow(std::uint32_t y, const RGBA8Pixel* from, RGBA8Pixel* to,
                          std::size_t count) const {
  const bool vignette = look_.vignette != nullptr;
  switch (way_) {
    case Way::scalar:
      return applyLookToRowScalar(look_, coordinates_, vignette ? rows_.v(y) : 0.0f, from, to,
                                  count);
    case Way::table:
      if (!vignette) return applyLookTable(tables_.front(), from, to, count);
      return applyLookTables(tables_.data(), rows_.row(y), from, to, count);
    case Way::direct:
      return applyDirectLook(*direct_, vignette ? rows_.row(y) : VignetteRow{}, from, to, count);
  }
}

}  // namespace pelorin::image_processing
