#include "image_processing/filters/looks/low_dim_rgb_curve_filter.h"

#include <array>
#include <cstddef>

#include "image_processing/core/parameter_strings.h"
#include "image_processing/filters/looks/low_dim_curves.h"

namespace pelorin::image_processing {
namespace {

constexpr std::array<const char*, 4> keys = {"s1", "s2", "s3", "s4"};
constexpr float standard = 0.5f;

// NaN stays NaN.
float clampToUnit(float value) {
  return value < 0.0f ? 0.0f : value > 1.0f ? 1.0f : value;
}

std::array<float, 4> readParameters(const std::string& params) {
  std::array<float, 4> s = {standard, standard, standard, standard};
  for (const std::string& item : splitStringAt(params, ";")) {
    const std::vector<std::string> keyAndValue = splitStringOnceAt(item, "=");
    for (std::size_t i = 0; i < s.size(); ++i) {
      if (keyAndValue[0] == keys[i]) {
        s[i] = static_cast<float>(readNumber(keyAndValue[1]));
      }
    }
  }
  return s;
}

}  // namespace

FilterParameters LowDimRGBCurveFilter::parameters() {
  FilterParameters parameters = AbstractRGBCurveFilter::parameters();
  for (std::size_t i = 0; i < keys.size(); ++i) {
    parameters.rows.push_back({.name = keys[i],
                               .kind = ParameterKind::number,
                               .description = "Weight of component " + std::to_string(i + 1) +
                                              " of the curves, of which 0.5 takes nothing",
                               .lowest = 0.0f,
                               .highest = 1.0f,
                               .standard = standard});
  }
  return parameters;
}

void LowDimRGBCurveFilter::getRGBCurves(std::vector<float>& red, std::vector<float>& green,
                                        std::vector<float>& blue, const std::string& params) {
  constexpr std::array<float, 4> scales = {0.46027565f, 0.40102503f, 0.307871f, 0.25171766f};
  std::array<float, 4> w = readParameters(params);
  for (std::size_t i = 0; i < w.size(); ++i) w[i] = (2.0f * clampToUnit(w[i]) - 1.0f) * scales[i];

  const std::array<std::vector<float>*, 3> curves = {&red, &green, &blue};
  for (std::size_t c = 0; c < curves.size(); ++c) {
    float highest = 0.0f;
    for (std::size_t i = 0; i < lowDimMean[c].size(); ++i) {
      // The order of the sum is part of the result.
      const float value = clampToUnit(
          w[1] * lowDimComponent2[c][i] + w[0] * lowDimComponent1[c][i] +
          w[2] * lowDimComponent3[c][i] + w[3] * lowDimComponent4[c][i] + lowDimMean[c][i]);
      if (!(value < highest)) highest = value;
      curves[c]->push_back(255.0f * highest);
    }
  }
}

}  // namespace pelorin::image_processing
