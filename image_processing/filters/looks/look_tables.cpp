#include "image_processing/filters/looks/look_tables.h"

#include "image_processing/filters/looks/direct_look.h"
#include "image_processing/filters/looks/soft_light.h"

namespace pelorin::image_processing {
namespace {

constexpr std::size_t values = 256;

// A row of pixels that all take one sample of the mask.
std::vector<LookTable> tablesByDirectLook(const Look& look) {
  std::array<RGBA8Pixel, values> greys, pixels;
  for (std::size_t value = 0; value < values; ++value) {
    const auto byte = static_cast<std::uint8_t>(value);
    greys[value] = {byte, byte, byte, byte};
  }
  const DirectLook direct(look);
  std::vector<LookTable> tables(look.vignette->samples().size());
  const float last = static_cast<float>(tables.size() - 1);
  std::array<float, values> squares;
  for (std::size_t sample = 0; sample < tables.size(); ++sample) {
    squares.fill((static_cast<float>(sample) + 0.5f) / last);
    applyDirectLook(direct, {squares.data(), 0.0f, last}, greys.data(), pixels.data(), values);
    // Pointers, for compilers that are asked for small code and call every operator otherwise.
    std::uint8_t* const red = tables[sample][0].data();
    std::uint8_t* const green = tables[sample][1].data();
    std::uint8_t* const blue = tables[sample][2].data();
    const RGBA8Pixel* pixel = pixels.data();
    for (std::size_t value = 0; value < values; ++value, ++pixel) {
      red[value] = pixel->r;
      green[value] = pixel->g;
      blue[value] = pixel->b;
    }
  }
  return tables;
}

LookTable tableAt(const Look& look, const float* mask) {
  LookTable table;
  for (std::size_t value = 0; value < values; ++value) {
    float x = static_cast<float>(value);
    if (mask != nullptr) x = vignetteChannel(x, *mask, look.maskAlpha);
    for (std::size_t c = 0; c < table.size(); ++c) table[c][value] = look.curves[c](x);
  }
  return table;
}

}  // namespace

LookTable lookTable(const Look& look) {
  return tableAt(look, nullptr);
}

std::vector<LookTable> lookTables(const Look& look) {
  if (DirectLook::canCompute(look)) return tablesByDirectLook(look);
  std::vector<LookTable> tables;
  tables.reserve(look.vignette->samples().size());
  for (const float& mask : look.vignette->samples()) tables.push_back(tableAt(look, &mask));
  return tables;
}

}  // namespace pelorin::image_processing
