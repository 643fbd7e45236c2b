#include "image_processing/filters/looks/look_parameters.h"

#include <utility>

#include "image_processing/core/parameter_strings.h"

namespace pelorin::image_processing {
namespace {

FilterParameter curveRow(const char* key, const char* colour, const std::string& inOut) {
  return {.name = key,
          .kind = ParameterKind::numbers,
          .description = std::string(colour) + " out for " + inOut +
                         " in at equal steps, from none to full, in place of the look's own curve",
          .lowest = 0.0f,
          .highest = 1.0f,
          .fewest = 2};
}

}  // namespace

FilterParameters lookParameters(float maskRadius, float maskAlpha, bool applyMask) {
  return {.rows = {{.name = "maskRadius",
                    .kind = ParameterKind::number,
                    .description = "Where the vignette ends, in halves of the picture's height",
                    .lowest = 0.0f,
                    .aboveLowest = true,
                    .standard = maskRadius,
                    .onlyWith = "applyMask"},
                   {.name = "maskAlpha",
                    .kind = ParameterKind::number,
                    .description = "How strong the vignette is",
                    .lowest = 0.0f,
                    .highest = 1.0f,
                    .standard = maskAlpha,
                    .onlyWith = "applyMask"},
                   {.name = "applyMask",
                    .kind = ParameterKind::boolean,
                    .description = "With a vignette",
                    .standard = applyMask ? 1.0f : 0.0f},
                   curveRow("r", "Red", "red"),
                   curveRow("g", "Green", "green"),
                   curveRow("b", "Blue", "blue")},
          .reader = ParameterReader::splitStrings};
}

void replaceCurves(std::vector<float>& red, std::vector<float>& green, std::vector<float>& blue,
                   const std::string& params) {
  for (const std::string& item : splitStringAt(params, ";")) {
    const std::vector<std::string> keyAndValue = splitStringOnceAt(item, "=");
    const std::string& key = keyAndValue[0];
    std::vector<float>* const curve = key == "r"   ? &red
                                      : key == "g" ? &green
                                      : key == "b" ? &blue
                                                   : nullptr;
    if (curve == nullptr) continue;
    std::vector<float> samples;
    for (const std::string& number : splitStringAt(keyAndValue[1], ",")) {
      samples.push_back(static_cast<float>(readNumber(number) * 255.0));
    }
    if (samples.size() >= 2) *curve = std::move(samples);
  }
}

void replaceMaskSettings(float& maskRadius, float& maskAlpha, bool& applyMask,
                         const std::string& params) {
  for (const std::string& item : splitStringAt(params, ";")) {
    const std::vector<std::string> keyAndValue = splitStringOnceAt(item, "=");
    const std::string& key = keyAndValue[0];
    const std::string& value = keyAndValue[1];
    if (key == "maskRadius") {
      maskRadius = static_cast<float>(readNumber(value));
    } else if (key == "maskAlpha") {
      maskAlpha = static_cast<float>(readNumber(value));
    } else if (key == "applyMask") {
      applyMask = readNumber(value) != 0.0;
    }
  }
}

}  // namespace pelorin::image_processing
