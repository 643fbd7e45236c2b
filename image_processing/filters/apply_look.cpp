#include "image_processing/filters/apply_look.h"

#include <algorithm>
#include <optional>

#include "image_processing/filters/look_blocks.h"
#include "image_processing/filters/look_planes.h"
#include "image_processing/filters/look_tables.h"
#include "image_processing/filters/vignette_coordinates.h"
#include "image_processing/filters/vignette_rows.h"

namespace pelorin::image_processing {
namespace {

// Filling the rows that a picture needs costs about as much as 400 pixels for each possible row.
bool tablesPay(const Look& look, std::size_t pixels) {
  const std::size_t rows = look.vignette == nullptr ? 1 : look.vignette->samples().size();
  return look.mix == ChannelMix::none && pixels >= 400 * rows;
}

}  // namespace

void applyLook(const Look& look, const Image<RGBA8Pixel>& source, Image<RGBA8Pixel>& output) {
  const std::size_t pixels = std::min(source.pixelCount(), output.pixelCount());
  const bool byTables = tablesPay(look, pixels);
  const VignetteCoordinates coordinates(source.width, source.height, look.maskRadius);
  if ((look.vignette != nullptr && !VignetteRows::canCover(coordinates)) ||
      (!byTables && !LookPlanes::canCompute(look))) {
    applyLookScalar(look, source, output);
    return;
  }

  std::optional<VignetteRows> rows;
  if (look.vignette != nullptr) rows.emplace(coordinates, source.width, *look.vignette);
  VignetteRows* const rowsOrNone = rows.has_value() ? &*rows : nullptr;
  if (!byTables) {
    const LookPlanes planes(look);
    forEachLookBlock(source, output, rowsOrNone, [&](auto... block) { planes.apply(block...); });
    return;
  }
  LookTables tables(look);
  if (look.vignette == nullptr) {
    applyLookTable(tables.at(0), source.data.get(), output.data.get(), pixels);
    return;
  }
  forEachLookBlock(source, output, rowsOrNone,
                   [&](auto... block) { applyLookTables(tables, block...); });
}

}  // namespace pelorin::image_processing
