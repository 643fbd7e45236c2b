#include "image_processing/filters/looks/apply_look.h"

#include <algorithm>
#include <vector>

#include "image_processing/filters/looks/direct_look.h"
#include "image_processing/filters/looks/look_tables.h"
#include "image_processing/filters/looks/vignette_coordinates.h"
#include "image_processing/filters/looks/vignette_rows.h"

namespace pelorin::image_processing {
namespace {

// Filling a table takes about as long as it saves on 400 pixels.
bool tablesPay(const Look& look, std::size_t pixels) {
  const std::size_t tables = look.vignette == nullptr ? 1 : look.vignette->samples().size();
  return look.mix == ChannelMix::none && pixels >= 400 * tables;
}

// Calls `row(from, to, count)` for the pixels of each row of `source` that both images have.
template <typename Row>
void forEachRow(const Image<RGBA8Pixel>& source, Image<RGBA8Pixel>& output, Row row) {
  const std::size_t pixels = std::min(source.pixelCount(), output.pixelCount());
  for (std::size_t first = 0; first < pixels; first += source.width) {
    row(source.data.get() + first, output.data.get() + first,
        std::min<std::size_t>(source.width, pixels - first));
  }
}

}  // namespace

void applyLook(const Look& look, const Image<RGBA8Pixel>& source, Image<RGBA8Pixel>& output) {
  const std::size_t pixels = std::min(source.pixelCount(), output.pixelCount());
  const bool byTables = tablesPay(look, pixels);
  const VignetteCoordinates coordinates(source.width, source.height, look.maskRadius);
  if ((look.vignette != nullptr && !VignetteRows::canCover(coordinates)) ||
      (!byTables && !DirectLook::canCompute(look))) {
    applyLookScalar(look, source, output);
    return;
  }

  if (look.vignette == nullptr && byTables) {
    applyLookTable(lookTable(look), source.data.get(), output.data.get(), pixels);
    return;
  }
  if (look.vignette == nullptr) {
    applyDirectLook(DirectLook(look), {}, source.data.get(), output.data.get(), pixels);
    return;
  }
  VignetteRows rows(coordinates, source.width, *look.vignette);
  if (byTables) {
    const std::vector<LookTable> tables = lookTables(look);
    forEachRow(source, output, [&](auto... pixelsOfRow) {
      applyLookTables(tables.data(), rows.row(), pixelsOfRow...);
      rows.advance();
    });
    return;
  }
  const DirectLook direct(look);
  forEachRow(source, output, [&](auto... pixelsOfRow) {
    applyDirectLook(direct, rows.row(), pixelsOfRow...);
    rows.advance();
  });
}

}  // namespace pelorin::image_processing
