#include "image_processing/filters/looks/apply_look.h"
#include "image_processing/filters/looks/soft_light.h"
#include "image_processing/filters/looks/vignette_coordinates.h"

namespace pelorin::image_processing {

void applyLookScalar(const Look& look, const Image<RGBA8Pixel>& source, Image<RGBA8Pixel>& output) {
  const VignetteCoordinates coordinates(source.width, source.height, look.maskRadius);
  float u = coordinates.firstU;
  float v = coordinates.firstV;
  Image<RGBA8Pixel>::ImageForwardIteratorXY from(source);
  Image<RGBA8Pixel>::ImageForwardIterator to(output);
  for (; !from.atEnd() && !to.atEnd(); ++from, ++to) {
    Rgb c{static_cast<float>(from->r), static_cast<float>(from->g), static_cast<float>(from->b)};
    if (look.vignette != nullptr) {
      if (from.x() > 0) {
        u += coordinates.step;
      } else {
        u = coordinates.firstU;
        if (from.y() > 0) v += coordinates.step;
      }
      const float mask = (*look.vignette)(u * u + v * v);
      c.r = vignetteChannel(c.r, mask, look.maskAlpha);
      c.g = vignetteChannel(c.g, mask, look.maskAlpha);
      c.b = vignetteChannel(c.b, mask, look.maskAlpha);
    }
    const Rgb mixed = mixChannels(look.mix, c);
    *to = {look.curves[0](mixed.r), look.curves[1](mixed.g), look.curves[2](mixed.b), from->a};
  }
}

}  // namespace pelorin::image_processing
