#include "cli/pictures/canvas.h"

#include <cstring>
#include <new>

namespace pelorin::cli {

using image_processing::Image;
using image_processing::RGBA8Pixel;

Canvas::Canvas(std::uint32_t width, std::uint32_t height, double pixelsPerUnit) {
  if (width > largestSide || height > largestSide) throw std::bad_alloc();
  surface_.reset(cairo_image_surface_create(CAIRO_FORMAT_RGB24, static_cast<int>(width),
                                            static_cast<int>(height)));
  context_.reset(cairo_create(surface_.get()));
  if (cairo_status(context()) != CAIRO_STATUS_SUCCESS) throw std::bad_alloc();
  cairo_set_source_rgb(context(), 1, 1, 1);
  cairo_paint(context());
  cairo_scale(context(), pixelsPerUnit, pixelsPerUnit);
}

void Canvas::paste(const Image<RGBA8Pixel>& picture, std::uint32_t x, std::uint32_t y) {
  cairo_surface_flush(surface_.get());
  const std::size_t stride = cairo_image_surface_get_stride(surface_.get());
  unsigned char* bytes = cairo_image_surface_get_data(surface_.get());
  for (std::uint32_t row = 0; row < picture.height; ++row) {
    const RGBA8Pixel* from = picture.row(row);
    unsigned char* to = bytes + (std::size_t{y} + row) * stride + std::size_t{x} * 4;
    for (std::uint32_t column = 0; column < picture.width; ++column) {
      const RGBA8Pixel& p = from[column];
      const std::uint32_t packed = std::uint32_t{p.r} << 16 | std::uint32_t{p.g} << 8 | p.b;
      std::memcpy(to + std::size_t{column} * 4, &packed, sizeof(packed));
    }
  }
  cairo_surface_mark_dirty(surface_.get());
}

Image<RGBA8Pixel> Canvas::picture() const {
  if (cairo_status(context()) != CAIRO_STATUS_SUCCESS) throw std::bad_alloc();
  cairo_surface_flush(surface_.get());
  const std::size_t stride = cairo_image_surface_get_stride(surface_.get());
  const unsigned char* bytes = cairo_image_surface_get_data(surface_.get());
  Image<RGBA8Pixel> picture(cairo_image_surface_get_width(surface_.get()),
                            cairo_image_surface_get_height(surface_.get()));
  for (std::uint32_t y = 0; y < picture.height; ++y) {
    const unsigned char* from = bytes + y * stride;
    RGBA8Pixel* to = picture.row(y);
    for (std::uint32_t x = 0; x < picture.width; ++x) {
      std::uint32_t packed;
      std::memcpy(&packed, from + std::size_t{x} * 4, sizeof(packed));
      to[x] = {static_cast<std::uint8_t>(packed >> 16), static_cast<std::uint8_t>(packed >> 8),
               static_cast<std::uint8_t>(packed), 255};
    }
  }
  return picture;
}

void setColour(cairo_t* context, const Colour& colour) {
  cairo_set_source_rgb(context, colour.r, colour.g, colour.b);
}

}  // namespace pelorin::cli
