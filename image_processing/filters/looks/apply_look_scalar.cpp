#include <algorithm>

#include "image_processing/filters/looks/apply_look.h"
#include "image_processing/filters/looks/look_rows.h"
#include "image_processing/filters/looks/soft_light.h"

namespace pelorin::image_processing {

void applyLookToRowScalar(const Look& look, const VignetteCoordinates& coordinates, float v,
                          const RGBA8Pixel* from, RGBA8Pixel* to, std::size_t count) {
  float u = coordinates.firstU;
  for (std::size_t x = 0; x < count; ++x) {
    const RGBA8Pixel pixel = from[x];
    Rgb c{static_cast<float>(pixel.r), static_cast<float>(pixel.g), static_cast<float>(pixel.b)};
    if (look.vignette != nullptr) {
      const float mask = (*look.vignette)(u * u + v * v);
      c.r = vignetteChannel(c.r, mask, look.maskAlpha);
      c.g = vignetteChannel(c.g, mask, look.maskAlpha);
      c.b = vignetteChannel(c.b, mask, look.maskAlpha);
      u += coordinates.step;
    }
    const Rgb mixed = mixChannels(look.mix, c);
    to[x] = {look.curves[0](mixed.r), look.curves[1](mixed.g), look.curves[2](mixed.b), pixel.a};
  }
}

void applyLookScalar(const Look& look, const Image<RGBA8Pixel>& source, Image<RGBA8Pixel>& output) {
  const VignetteCoordinates coordinates(source.width, source.height, look.maskRadius);
  float v = coordinates.firstV;
  const std::size_t pixels = std::min(source.pixelCount(), output.pixelCount());
  for (std::size_t first = 0; first < pixels; first += source.width) {
    applyLookToRowScalar(look, coordinates, v, source.data.get() + first, output.data.get() + first,
                         std::min<std::size_t>(source.width, pixels - first));
    v += coordinates.step;
  }
}

}  // namespace pelorin::image_processing
