#include "cli/pictures/annotated_photo.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <memory>

#include "cli/pictures/plot.h"
#include "cli/pictures/text.h"

namespace pelorin::cli {

using image_processing::Image;
using image_processing::RGBA8Pixel;

namespace {

// Lengths in pixels.
constexpr double margin = 28, heading = 82, footing = 92, narrowest = 520;
constexpr std::uint32_t longestShown = 2000, enlargedTo = 800;
constexpr TextStyle titleStyle{20, {0.10, 0.11, 0.13}, true};
constexpr TextStyle subtitleStyle{14, {0.33, 0.35, 0.39}};
constexpr TextStyle labelStyle{14, {0.20, 0.21, 0.24}};
constexpr TextStyle tickStyle{13, {0.33, 0.35, 0.39}};
constexpr Colour background{0.955, 0.957, 0.962}, frame{0.45, 0.47, 0.50};

// Of a tiny one more than it has.
photo::PictureSize sizeInPicture(photo::PictureSize photo) {
  const std::uint32_t longer = std::max(photo.width, photo.height);
  const std::uint32_t factor = longer >= enlargedTo ? 1 : (enlargedTo + longer - 1) / longer;
  return photo::fitWithin({photo.width * factor, photo.height * factor},
                          {longestShown, longestShown});
}

std::uint32_t canvasSide(double shown, double around) {
  return static_cast<std::uint32_t>(shown + around);
}

std::uint8_t mutedChannel(std::uint8_t channel, double grey) {
  return static_cast<std::uint8_t>(std::lround(0.3 * channel + 0.7 * grey));
}

Image<RGBA8Pixel> muted(const Image<RGBA8Pixel>& picture) {
  Image<RGBA8Pixel> result(picture.width, picture.height);
  std::transform(picture.data.get(), picture.data.get() + picture.pixelCount(), result.data.get(),
                 [](const RGBA8Pixel& p) {
                   const double grey = 0.3 * p.r + 0.6 * p.g + 0.1 * p.b;
                   return RGBA8Pixel{mutedChannel(p.r, grey), mutedChannel(p.g, grey),
                                     mutedChannel(p.b, grey), 255};
                 });
  return result;
}

void paintPhoto(cairo_t* c, const Image<RGBA8Pixel>& photo, photo::PictureSize shown) {
  const Image<RGBA8Pixel> picture = muted(photo);
  Canvas pixels(picture.width, picture.height);
  pixels.paste(picture, 0, 0);
  cairo_save(c);
  cairo_scale(c, static_cast<double>(shown.width) / picture.width,
              static_cast<double>(shown.height) / picture.height);
  cairo_set_source_surface(c, cairo_get_target(pixels.context()), 0, 0);
  cairo_pattern_set_filter(cairo_get_source(c), CAIRO_FILTER_NEAREST);
  cairo_paint(c);
  cairo_restore(c);
}

}  // namespace

photo::PictureSize ShownPhoto::shownSize(photo::PictureSize photo) {
  return photo::fitWithin(photo, {longestShown, longestShown});
}

ShownPhoto::ShownPhoto(const Pixels& photo)
    : ShownPhoto(photo::areaAverage(photo, shownSize({photo.width, photo.height})),
                 {photo.width, photo.height}) {}

RowsToShow::RowsToShow(image_processing::RowSource& rows, photo::PictureSize size)
    : rows_(rows), size_(size), average_(size, ShownPhoto::shownSize(size)) {}

const RGBA8Pixel* RowsToShow::next(std::uint32_t count, RGBA8Pixel* room) {
  const RGBA8Pixel* const rows = rows_.next(count, room);
  for (std::uint32_t i = 0; i < count; ++i) average_.addRow(rows + std::size_t{size_.width} * i);
  return rows;
}

AnnotatedPhoto::AnnotatedPhoto(const ShownPhoto& photo, const std::string& title,
                               const std::string& subtitle)
    : shownWidth_(sizeInPicture(photo.size).width),
      shownHeight_(sizeInPicture(photo.size).height),
      left_(margin + std::floor(std::max(0.0, narrowest - shownWidth_) / 2)),
      top_(heading),
      scaleX_(shownWidth_ / photo.size.width),
      scaleY_(shownHeight_ / photo.size.height),
      canvas_(canvasSide(std::max(narrowest, shownWidth_), 2 * margin),
              canvasSide(shownHeight_, heading + footing)) {
  cairo_t* c = context();
  setColour(c, background);
  cairo_paint(c);
  const double room = std::max(narrowest, shownWidth_);
  drawText(c, shortenedToWidth(c, title, titleStyle, room), margin, 38, titleStyle);
  drawText(c, shortenedToWidth(c, subtitle, subtitleStyle, room), margin, 62, subtitleStyle);

  cairo_translate(c, left_, top_);
  cairo_rectangle(c, 0, 0, shownWidth_, shownHeight_);
  cairo_clip(c);
  paintPhoto(c, photo.pixels, sizeInPicture(photo.size));
  cairo_scale(c, scaleX_, scaleY_);
}

AnnotatedPhoto::Photo AnnotatedPhoto::withScale(const ColourScale& scale,
                                                const std::string& label) const {
  cairo_t* c = context();
  cairo_save(c);
  cairo_identity_matrix(c);
  cairo_reset_clip(c);

  constexpr double width = narrowest;
  const double baseline = top_ + shownHeight_ + 26, barTop = baseline + 10, barHeight = 14;
  drawText(c, label, margin, baseline, labelStyle);
  struct Destroy {
    void operator()(cairo_pattern_t* pattern) const { cairo_pattern_destroy(pattern); }
  };
  const std::unique_ptr<cairo_pattern_t, Destroy> colours(
      cairo_pattern_create_linear(margin, 0, margin + width, 0));
  constexpr int steps = 64;
  for (int i = 0; i <= steps; ++i) {
    const double share = static_cast<double>(i) / steps;
    const Colour colour = scale(std::lerp(scale.low, scale.high, share));
    cairo_pattern_add_color_stop_rgb(colours.get(), share, colour.r, colour.g, colour.b);
  }
  cairo_rectangle(c, margin, barTop, width, barHeight);
  cairo_set_source(c, colours.get());
  cairo_fill(c);

  setColour(c, frame);
  cairo_set_line_width(c, 1);
  for (const double value : roundTicks(scale.low, scale.high, 8)) {
    const double x = margin + (value - scale.low) / (scale.high - scale.low) * width;
    const double crisp = std::floor(std::min(x, margin + width - 1)) + 0.5;
    setColour(c, frame);
    cairo_move_to(c, crisp, barTop + barHeight);
    cairo_line_to(c, crisp, barTop + barHeight + 5);
    cairo_stroke(c);
    char text[32];
    std::snprintf(text, sizeof(text), "%g", value);
    drawText(c, text, x, barTop + barHeight + 20, tickStyle, Align::centre);
  }
  cairo_restore(c);
  return canvas_.picture();
}

}  // namespace pelorin::cli
