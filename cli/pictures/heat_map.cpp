#include "cli/pictures/heat_map.h"

#include <cmath>

namespace pelorin::cli {
namespace {

/// How much of a tint covers the photo, and of the white below it that keeps tints of dark parts
/// from looking black.
constexpr double opacity = 0.55, whiteness = 0.2;

}  // namespace

AnnotatedPhoto::Photo drawHeatMap(const ShownPhoto& photo, const BlockValues& blocks,
                                  const std::string& title, const std::string& subtitle,
                                  const std::string& label) {
  const AnnotatedPhoto picture(photo, title, subtitle);
  const ColourScale scale = scaleAcross(blocks.values);
  cairo_t* c = picture.context();
  // Smooth edges of neighbours that meet within a pixel would let the photo shine through.
  cairo_set_antialias(c, CAIRO_ANTIALIAS_NONE);
  for (std::size_t i = 0; i < blocks.values.size(); ++i) {
    if (!std::isfinite(blocks.values[i])) continue;
    const Colour colour = scale(blocks.values[i]);
    const double x = static_cast<double>(i % blocks.columns) * blocks.blockSize;
    const double y = static_cast<double>(i / blocks.columns) * blocks.blockSize;
    cairo_rectangle(c, x, y, blocks.blockSize, blocks.blockSize);
    cairo_set_source_rgba(c, 1, 1, 1, whiteness);
    cairo_fill_preserve(c);
    cairo_set_source_rgba(c, colour.r, colour.g, colour.b, opacity);
    cairo_fill(c);
  }
  return picture.withScale(scale, label);
}

}  // namespace pelorin::cli
