#include "cli/pictures/tone_curve_plot.h"

#include <cstddef>

namespace pelorin::cli {
namespace {

constexpr double percent = 100;

std::vector<PlotPoint> pointsOf(const std::vector<float>& samples) {
  std::vector<PlotPoint> points;
  points.reserve(samples.size());
  const double last = static_cast<double>(samples.size()) - 1;
  for (const float sample : samples)
    points.push_back({percent * static_cast<double>(points.size()) / last, percent * sample});
  return points;
}

}  // namespace

Plot toneCurvePlot(const std::string& title, const std::string& subtitle,
                   const std::vector<float>& curve, const std::vector<float>& cdf,
                   std::int32_t faceMedianBin) {
  constexpr Colour grey{0.55, 0.57, 0.61}, blue{0.22, 0.47, 0.75}, red{0.82, 0.20, 0.22},
      green{0.16, 0.54, 0.32};
  Plot plot{title,
            subtitle,
            {"Lightness of the photo (L*)", 0, percent},
            {"Lightness after the curve (L*)  \xC2\xB7  share of darker pixels (%)", 0, percent},
            {},
            {}};
  plot.lines.push_back({"unchanged", {{0, 0}, {percent, percent}}, grey, 1.5, true});
  plot.lines.push_back({"share of darker pixels", pointsOf(cdf), blue, 1.25});
  plot.lines.push_back({"tone curve", pointsOf(curve), red, 3.25});
  if (faceMedianBin >= 0) {
    const double steps = static_cast<double>(curve.size()) - 1;
    plot.marks.push_back({"face median", percent * faceMedianBin / steps, green});
  }
  return plot;
}

}  // namespace pelorin::cli
