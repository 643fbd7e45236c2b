#include "cli/pictures/plot.h"

#include <algorithm>
#include <cmath>
#include <cstdio>

#include "cli/pictures/text.h"

namespace pelorin::cli {
namespace {

constexpr double pixelsPerUnit = 2;
constexpr double width = 720, height = 660;
constexpr double left = 76, top = 104, right = width - 28, bottom = height - 64;

constexpr Colour ink{0.13, 0.14, 0.16}, faint{0.40, 0.42, 0.46}, gridColour{0.90, 0.91, 0.93},
    frameColour{0.62, 0.64, 0.68};
constexpr TextStyle titleStyle{17, ink, true}, subtitleStyle{12, faint}, labelStyle{13, ink},
    tickStyle{11.5, faint}, legendStyle{12, ink};

/// Where the values of one axis lie along one side of the plot area.
struct Scale {
  double low, high, from, to;

  double operator()(double value) const {
    return from + (value - low) / (high - low) * (to - from);
  }
};

std::string tickText(double value) {
  char text[32];
  std::snprintf(text, sizeof(text), "%g", value);
  return text;
}

/// Ends a line's pixels on whole device pixels, so that a hairline is one sharp line.
double crisp(double position) {
  return (std::floor(position * pixelsPerUnit) + 0.5) / pixelsPerUnit;
}

void strokeSegment(cairo_t* c, double x0, double y0, double x1, double y1, const Colour& colour,
                   double lineWidth) {
  setColour(c, colour);
  cairo_set_line_width(c, lineWidth);
  cairo_move_to(c, x0, y0);
  cairo_line_to(c, x1, y1);
  cairo_stroke(c);
}

void drawAxes(cairo_t* c, const Plot& plot, const Scale& x, const Scale& y) {
  for (double value : roundTicks(plot.horizontal.low, plot.horizontal.high, 10)) {
    const double at = crisp(x(value));
    strokeSegment(c, at, top, at, bottom, gridColour, 1);
    drawText(c, tickText(value), at, bottom + 18, tickStyle, Align::centre);
  }
  for (double value : roundTicks(plot.vertical.low, plot.vertical.high, 10)) {
    const double at = crisp(y(value));
    strokeSegment(c, left, at, right, at, gridColour, 1);
    drawText(c, tickText(value), left - 9, at + 4, tickStyle, Align::right);
  }
  drawText(c, plot.horizontal.label, (left + right) / 2, bottom + 46, labelStyle, Align::centre);
  cairo_save(c);
  cairo_translate(c, 26, (top + bottom) / 2);
  cairo_rotate(c, -M_PI / 2);
  drawText(c, plot.vertical.label, 0, 0, labelStyle, Align::centre);
  cairo_restore(c);
}

void setPen(cairo_t* c, const PlotLine& line) {
  setColour(c, line.colour);
  cairo_set_line_width(c, line.width);
  cairo_set_line_join(c, CAIRO_LINE_JOIN_ROUND);
  cairo_set_line_cap(c, line.dashed ? CAIRO_LINE_CAP_BUTT : CAIRO_LINE_CAP_ROUND);
  const double dashes[] = {7, 5};
  cairo_set_dash(c, dashes, line.dashed ? 2 : 0, 0);
}

/// Cairo's coordinates end at some millions; what is cut off anyway may end nearer.
double nearby(double position) {
  return std::clamp(position, -10000.0, 10000.0);
}

void drawLine(cairo_t* c, const PlotLine& line, const Scale& x, const Scale& y) {
  bool drawing = false;
  double lastX = 0;
  const auto close = [&] {
    if (drawing && line.filled) {
      cairo_line_to(c, lastX, bottom);
      cairo_close_path(c);
    }
    drawing = false;
  };
  for (const PlotPoint& point : line.points) {
    if (!std::isfinite(point.x) || !std::isfinite(point.y)) {
      close();
      continue;
    }
    const double px = nearby(x(point.x)), py = nearby(y(point.y));
    if (!drawing && line.filled) cairo_move_to(c, px, bottom);
    if (drawing || line.filled) {
      cairo_line_to(c, px, py);
    } else {
      cairo_move_to(c, px, py);
    }
    drawing = true;
    lastX = px;
  }
  close();
  setPen(c, line);
  if (line.filled) {
    cairo_set_source_rgba(c, line.colour.r, line.colour.g, line.colour.b, 0.35);
    cairo_fill(c);
  } else {
    cairo_stroke(c);
  }
  cairo_set_dash(c, nullptr, 0, 0);
}

void drawMark(cairo_t* c, const PlotMark& mark, const Scale& x) {
  if (!(mark.x >= x.low && mark.x <= x.high)) return;
  const double at = crisp(x(mark.x));
  strokeSegment(c, at, top, at, bottom, mark.colour, 1.5);
  const TextStyle style{12, mark.colour, true};
  const bool fitsRight = at + 7 + textWidth(c, mark.label, style) < right - 4;
  const double foot = bottom - 12;
  drawText(c, mark.label, fitsRight ? at + 7 : at - 7, foot, style,
           fitsRight ? Align::left : Align::right);
}

void drawLegend(cairo_t* c, const Plot& plot) {
  constexpr double sample = 26, gap = 7, between = 24, baseline = top - 16;
  double x = left;
  for (const PlotLine& line : plot.lines) {
    if (line.label.empty()) continue;
    setPen(c, line);
    cairo_move_to(c, x, baseline - 4);
    cairo_line_to(c, x + sample, baseline - 4);
    if (line.filled) cairo_set_line_width(c, 9);
    cairo_stroke(c);
    cairo_set_dash(c, nullptr, 0, 0);
    drawText(c, line.label, x + sample + gap, baseline, legendStyle);
    x += sample + gap + textWidth(c, line.label, legendStyle) + between;
  }
}

}  // namespace

std::vector<double> roundTicks(double low, double high, int most) {
  const double least = (high - low) / most;
  const double power = std::pow(10, std::floor(std::log10(least)));
  double step = power;
  for (const double factor : {2.0, 5.0, 10.0}) {
    if (step < least * (1 - 1e-9)) step = factor * power;
  }
  std::vector<double> ticks;
  const double first = std::ceil(low / step - 1e-9);
  for (int i = 0; i <= most && (first + i) * step <= high + step * 1e-9; ++i) {
    ticks.push_back((first + i) * step);
  }
  return ticks;
}

image_processing::Image<image_processing::RGBA8Pixel> drawPlot(const Plot& plot) {
  const Canvas canvas(static_cast<std::uint32_t>(width * pixelsPerUnit),
                      static_cast<std::uint32_t>(height * pixelsPerUnit), pixelsPerUnit);
  cairo_t* c = canvas.context();
  const Scale x{plot.horizontal.low, plot.horizontal.high, left, right};
  const Scale y{plot.vertical.low, plot.vertical.high, bottom, top};
  const double room = right - left;
  drawText(c, shortenedToWidth(c, plot.title, titleStyle, room), left, 36, titleStyle);
  drawText(c, shortenedToWidth(c, plot.subtitle, subtitleStyle, room), left, 57, subtitleStyle);
  drawLegend(c, plot);
  drawAxes(c, plot, x, y);
  cairo_save(c);
  cairo_rectangle(c, left, top, right - left, bottom - top);
  cairo_clip(c);
  for (const PlotMark& mark : plot.marks) drawMark(c, mark, x);
  for (const PlotLine& line : plot.lines) drawLine(c, line, x, y);
  cairo_restore(c);
  setColour(c, frameColour);
  cairo_set_line_width(c, 1);
  cairo_rectangle(c, crisp(left), crisp(top), right - left, bottom - top);
  cairo_stroke(c);
  return canvas.picture();
}

PlotArea plotArea() {
  return {left * pixelsPerUnit, top * pixelsPerUnit, right * pixelsPerUnit, bottom * pixelsPerUnit};
}

}  // namespace pelorin::cli
