#pragma once

#include <cstdint>
#include <string>
#include <utility>

#include "cli/pictures/canvas.h"
#include "cli/pictures/colour_scale.h"
#include "image_processing/core/rows.h"
#include "photo/area_average.h"

namespace pelorin::cli {

/// A photo as large as it is shown at most, and how large it is.
struct ShownPhoto {
  using Pixels = image_processing::Image<image_processing::RGBA8Pixel>;

  /// @throws std::bad_alloc.
  ShownPhoto(const Pixels& photo);
  ShownPhoto(Pixels shown, photo::PictureSize whole) : pixels(std::move(shown)), size(whole) {}

  /// Of its pixels.
  static photo::PictureSize shownSize(photo::PictureSize photo);

  Pixels pixels;
  photo::PictureSize size;
};

/// The rows of a photo on their way to where they are needed, of which those of a `ShownPhoto` are made.
class RowsToShow : public image_processing::RowSource {
 public:
  /// @param rows  all of a photo; outlives this.
  RowsToShow(image_processing::RowSource& rows, photo::PictureSize size);

  const image_processing::RGBA8Pixel* next(std::uint32_t count,
                                           image_processing::RGBA8Pixel* room) override;

  /// Once all rows were read.
  ShownPhoto shown() const { return {average_.result(), size_}; }

 private:
  image_processing::RowSource& rows_;
  photo::PictureSize size_;
  photo::AreaAverage average_;
};

/// A photo with its colours muted, so that what is drawn on it shows, a title above it and a colour
/// scale below. A large photo is shown smaller, a tiny one with its pixels enlarged.
class AnnotatedPhoto {
 public:
  using Photo = ShownPhoto::Pixels;

  /// @param photo  at least one pixel; not kept.
  /// @param title  any bytes, shortened to fit.
  /// @throws std::bad_alloc when the picture does not fit into memory.
  AnnotatedPhoto(const ShownPhoto& photo, const std::string& title, const std::string& subtitle);

  /// Draws onto the photo alone, in its own pixels: (0, 0) is its top left corner.
  cairo_t* context() const { return canvas_.context(); }

  /// How many photo pixels one pixel of the picture spans, in either direction.
  double across() const { return 1 / scaleX_; }
  double down() const { return 1 / scaleY_; }

  /// Where in the picture the point (x, y) of the photo lies.
  struct Point {
    double x, y;
  };
  Point at(double x, double y) const { return {left_ + x * scaleX_, top_ + y * scaleY_}; }

  /// The finished picture, with what the colours stand for below the photo.
  Photo withScale(const ColourScale& scale, const std::string& label) const;

 private:
  double shownWidth_, shownHeight_;
  double left_, top_;
  double scaleX_, scaleY_;
  Canvas canvas_;
};

}  // namespace pelorin::cli
