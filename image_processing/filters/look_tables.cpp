#include "image_processing/filters/look_tables.h"

#include "image_processing/filters/soft_light.h"

namespace pelorin::image_processing {

LookTables::LookTables(const Look& look)
    : look_(look),
      filled_(look.vignette == nullptr ? 1 : look.vignette->samples().size()),
      rows_(std::make_unique_for_overwrite<Row[]>(filled_.size())) {}

void LookTables::fill(std::int32_t maskSample) {
  Row& row = rows_[maskSample];
  for (int value = 0; value < 256; ++value) {
    float x = static_cast<float>(value);
    if (look_.vignette != nullptr) {
      x = vignetteChannel(x, look_.vignette->samples()[maskSample], look_.maskAlpha);
    }
    for (std::size_t c = 0; c < row.size(); ++c) row[c][value] = look_.curves[c](x);
  }
  filled_[maskSample] = 1;
}

void applyLookTables(LookTables& tables, const RGBA8Pixel* from, RGBA8Pixel* to, std::size_t count,
                     const std::int32_t* maskSamples) {
  for (std::size_t i = 0; i < count; ++i) {
    const LookTables::Row& row = tables.at(maskSamples[i]);
    const RGBA8Pixel p = from[i];
    to[i] = {row[0][p.r], row[1][p.g], row[2][p.b], p.a};
  }
}

void applyLookTable(const LookTables::Row& row, const RGBA8Pixel* from, RGBA8Pixel* to,
                    std::size_t count) {
  for (std::size_t i = 0; i < count; ++i) {
    const RGBA8Pixel p = from[i];
    to[i] = {row[0][p.r], row[1][p.g], row[2][p.b], p.a};
  }
}

}  // namespace pelorin::image_processing
