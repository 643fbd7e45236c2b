#include "cli/pictures/colour_scale.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <iterator>

namespace pelorin::cli {
namespace {

constexpr std::array<Colour, 5> stops = {{{0.16, 0.36, 0.88},
                                          {0.10, 0.62, 0.68},
                                          {0.98, 0.91, 0.48},
                                          {0.96, 0.51, 0.16},
                                          {0.72, 0.06, 0.14}}};

}  // namespace

Colour ColourScale::operator()(double value) const {
  const double position = std::clamp((value - low) / (high - low), 0.0, 1.0) * (stops.size() - 1);
  const auto index = std::min(static_cast<std::size_t>(position), stops.size() - 2);
  const Colour &from = stops[index], &to = stops[index + 1];
  const double share = position - static_cast<double>(index);
  return {std::lerp(from.r, to.r, share), std::lerp(from.g, to.g, share),
          std::lerp(from.b, to.b, share)};
}

ColourScale scaleAcross(const std::vector<float>& values) {
  std::vector<double> finite;
  std::copy_if(values.begin(), values.end(), std::back_inserter(finite),
               [](float value) { return std::isfinite(value); });
  if (finite.empty()) return {0, 1};
  const auto [least, greatest] = std::minmax_element(finite.begin(), finite.end());
  if (*least == *greatest) return {*least - 0.5, *least + 0.5};
  return {*least, *greatest};
}

}  // namespace pelorin::cli
