#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "cli/pictures/plot.h"

namespace pelorin::cli {

/// How auto-enhance maps the lightness of one photo: the curve over the photo's own CDF and the
/// identity, all on 0 ... 100, and the median of the faces when there is one.
/// @param curve          samples at equal steps over the lightness range, in [0, 1].
/// @param cdf            share of pixels below each of the same steps, in [0, 1].
/// @param faceMedianBin  index of a sample, or -1.
Plot toneCurvePlot(const std::string& title, const std::string& subtitle,
                   const std::vector<float>& curve, const std::vector<float>& cdf,
                   std::int32_t faceMedianBin);

}  // namespace pelorin::cli
