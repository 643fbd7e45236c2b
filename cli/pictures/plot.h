#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "cli/pictures/canvas.h"

namespace pelorin::cli {

struct PlotPoint {
  double x, y;
};

/// One line through its points in order, or, filled, the area between it and the foot of the plot.
struct PlotLine {
  std::string label;  ///< For the legend; without one the line is not listed.
  std::vector<PlotPoint> points;
  Colour colour;
  double width = 1.5;  ///< In 1/72 inch, as every length here.
  bool dashed = false;
  bool filled = false;
};

/// A vertical line at `x` with a word beside it.
struct PlotMark {
  std::string label;
  double x;
  Colour colour;
};

/// An axis from `low` to `high`, `low` below `high`, both finite.
struct PlotAxis {
  std::string label;
  double low, high;
};

/// What a plot shows. What lies outside the axes is cut off; points that are not finite interrupt
/// their line.
struct Plot {
  std::string title;
  std::string subtitle;
  PlotAxis horizontal, vertical;
  std::vector<PlotLine> lines;  ///< Drawn in this order.
  std::vector<PlotMark> marks;
};

/// Round numbers (1, 2 or 5 times a power of ten apart) from `low` to `high`, at most `most` + 1.
std::vector<double> roundTicks(double low, double high, int most);

/// The plot as a picture of 1440 x 1320 pixels, title above, legend under it, ticks, grid and
/// labels around.
image_processing::Image<image_processing::RGBA8Pixel> drawPlot(const Plot& plot);

/// The area of that picture, in pixels, that the axes enclose: for whoever looks for ink.
struct PlotArea {
  double left, top, right, bottom;
};
PlotArea plotArea();

}  // namespace pelorin::cli
