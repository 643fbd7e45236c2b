#pragma once

#include <cstdint>
#include <memory>

#include "cli/pictures/cairo.h"
#include "image_processing/core/image.h"

namespace pelorin::cli {

/// Red, green and blue in [0, 1].
struct Colour {
  double r, g, b;
};

/// A white picture to draw on with Cairo. Not to be shared between threads.
class Canvas {
 public:
  static constexpr std::uint32_t largestSide = 32767;  ///< Cairo's own limit.

  /// @param pixelsPerUnit  what one unit of the drawing measures in pixels; above 1 for pictures
  ///                       that stay sharp when they are enlarged.
  /// @throws std::bad_alloc when the picture does not fit into memory or a side is above
  ///         `largestSide`.
  Canvas(std::uint32_t width, std::uint32_t height, double pixelsPerUnit = 1);

  cairo_t* context() const { return context_.get(); }

  /// Copies `picture` onto the canvas, alpha ignored; (x, y) in pixels, all of it inside.
  void paste(const image_processing::Image<image_processing::RGBA8Pixel>& picture, std::uint32_t x,
             std::uint32_t y);

  /// A copy of what has been drawn; alpha is 255.
  /// @throws std::bad_alloc when the copy, or anything drawn before, did not fit into memory.
  image_processing::Image<image_processing::RGBA8Pixel> picture() const;

 private:
  struct Destroy {
    void operator()(cairo_surface_t* surface) const { cairo_surface_destroy(surface); }
    void operator()(cairo_t* context) const { cairo_destroy(context); }
  };
  std::unique_ptr<cairo_surface_t, Destroy> surface_;
  std::unique_ptr<cairo_t, Destroy> context_;
};

void setColour(cairo_t* context, const Colour& colour);

}  // namespace pelorin::cli
