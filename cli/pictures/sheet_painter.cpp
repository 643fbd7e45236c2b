#include "cli/pictures/sheet_painter.h"

#include <algorithm>
#include <utility>

#include "cli/pictures/canvas.h"
#include "cli/pictures/text.h"

namespace pelorin::cli {

using image_processing::Image;
using image_processing::RGBA8Pixel;

namespace {

// Lengths in pixels.
constexpr std::uint32_t margin = 24, gap = 12, titleBand = 30, nameBand = 28, labelBand = 26,
                        rowGap = 18, narrowestColumn = 110;
constexpr TextStyle titleStyle{20, {0.10, 0.11, 0.13}, true};
constexpr TextStyle nameStyle{14, {0.20, 0.21, 0.24}, true};
constexpr TextStyle labelStyle{13, {0.33, 0.35, 0.39}};
// Neither is white: skies and snow end in white.
constexpr Colour background{0.955, 0.957, 0.962}, emptyCell{0.90, 0.905, 0.91};

void paintBackground(cairo_t* c) {
  setColour(c, background);
  cairo_paint(c);
}

}  // namespace

SheetPainter::SheetPainter(SheetPlan plan) : plan_(std::move(plan)), columnWidth_(narrowestColumn) {
  for (const photo::PictureSize& size : plan_.thumbnailSizes)
    columnWidth_ = std::max<std::uint64_t>(columnWidth_, size.width);
}

std::uint64_t SheetPainter::width() const {
  const std::uint64_t columns = plan_.columnLabels.size();
  return 2 * margin + columns * columnWidth_ + (columns - 1) * gap;
}

std::uint32_t SheetPainter::headingHeight() const {
  return margin + (plan_.title.empty() ? 0 : titleBand);
}

std::uint64_t SheetPainter::rowHeight(std::size_t index) const {
  return std::uint64_t{nameBand} + plan_.thumbnailSizes[index].height + labelBand + rowGap;
}

std::uint64_t SheetPainter::height() const {
  std::uint64_t height = headingHeight();
  for (std::size_t i = 0; i < plan_.thumbnailSizes.size(); ++i) height += rowHeight(i);
  return height;
}

bool SheetPainter::fits() const {
  return width() <= Canvas::largestSide && height() <= greatestHeight;
}

Image<RGBA8Pixel> SheetPainter::heading() const {
  const Canvas canvas(static_cast<std::uint32_t>(width()), headingHeight());
  cairo_t* c = canvas.context();
  paintBackground(c);
  const double room = static_cast<double>(width()) - 2 * margin;
  drawText(c, shortenedToWidth(c, plan_.title, titleStyle, room), margin, margin + 16, titleStyle);
  return canvas.picture();
}

Image<RGBA8Pixel> SheetPainter::row(std::size_t index, std::string_view label,
                                    const std::vector<Image<RGBA8Pixel>>& thumbnails,
                                    std::string_view note) const {
  Canvas canvas(static_cast<std::uint32_t>(width()), static_cast<std::uint32_t>(rowHeight(index)));
  cairo_t* c = canvas.context();
  paintBackground(c);
  const double room = static_cast<double>(width()) - 2 * margin;
  const photo::PictureSize cell{static_cast<std::uint32_t>(columnWidth_),
                                plan_.thumbnailSizes[index].height};
  drawText(c, shortenedToWidth(c, label, nameStyle, room), margin, nameBand - 10, nameStyle);
  if (thumbnails.empty()) {
    setColour(c, emptyCell);
    cairo_rectangle(c, margin, nameBand, room, cell.height);
    cairo_fill(c);
    drawText(c, shortenedToWidth(c, note, labelStyle, room), static_cast<double>(width()) / 2,
             nameBand + cell.height / 2.0 + 5, labelStyle, Align::centre);
    return canvas.picture();
  }
  for (std::size_t column = 0; column < thumbnails.size(); ++column) {
    const Image<RGBA8Pixel>& picture = thumbnails[column];
    const std::uint32_t left = margin + static_cast<std::uint32_t>(column) * (cell.width + gap);
    canvas.paste(picture, left + (cell.width - picture.width) / 2,
                 nameBand + (cell.height - picture.height) / 2);
    drawText(c, shortenedToWidth(c, plan_.columnLabels[column], labelStyle, cell.width),
             left + cell.width / 2.0, nameBand + cell.height + 18.0, labelStyle, Align::centre);
  }
  return canvas.picture();
}

}  // namespace pelorin::cli
