#include "cli/pictures/corner_picture.h"

#include <algorithm>
#include <cmath>

namespace pelorin::cli {
namespace {

// Lengths in pixels of the picture.
constexpr double radius = 4.5, thickness = 1.8, outline = 3.6;

}  // namespace

AnnotatedPhoto::Photo drawCorners(const ShownPhoto& photo, std::vector<MarkedPixel> pixels,
                                  const std::string& title, const std::string& subtitle,
                                  const std::string& label) {
  const AnnotatedPhoto picture(photo, title, subtitle);
  std::vector<float> values;
  for (const MarkedPixel& pixel : pixels) values.push_back(pixel.value);
  const ColourScale scale = scaleAcross(values);
  std::ranges::stable_sort(pixels, {}, &MarkedPixel::value);

  cairo_t* c = picture.context();
  cairo_scale(c, picture.across(), picture.down());
  for (const MarkedPixel& pixel : pixels) {
    const double x = (pixel.x + 0.5) / picture.across(), y = (pixel.y + 0.5) / picture.down();
    const Colour colour = scale(pixel.value);
    cairo_new_sub_path(c);
    cairo_arc(c, x, y, radius, 0, 2 * M_PI);
    cairo_set_source_rgba(c, 0, 0, 0, 0.55);
    cairo_set_line_width(c, outline);
    cairo_stroke_preserve(c);
    setColour(c, colour);
    cairo_set_line_width(c, thickness);
    cairo_stroke(c);
  }
  return picture.withScale(scale, label);
}

}  // namespace pelorin::cli
