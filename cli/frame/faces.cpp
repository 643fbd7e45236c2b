#include "cli/frame/faces.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <limits>
#include <string_view>

#include "cli/frame/errors.h"
#include "cli/frame/number_text.h"

namespace pelorin::cli {
namespace {

Face readFace(const std::string& text) {
  const auto refuse = [&text](const std::string& reason) {
    throw UsageError("--face: '" + text + "' " + reason);
  };
  std::array<float, 4> bounds;
  std::string_view rest = text;
  for (std::size_t i = 0; i < bounds.size(); ++i) {
    const std::size_t comma = rest.find(',');
    if ((comma == std::string_view::npos) != (i + 1 == bounds.size())) {
      refuse("is not left,top,right,bottom, for example 0.4,0.1,0.6,0.4");
    }
    bounds[i] = readFiniteNumber("--face", rest.substr(0, comma));
    if (comma != std::string_view::npos) rest.remove_prefix(comma + 1);
  }
  const auto [left, top, right, bottom] = bounds;
  const bool inPixels = std::ranges::max(bounds) > largestFaceFraction;
  if (inPixels && !std::ranges::all_of(bounds, [](float b) { return b == std::trunc(b); })) {
    refuse("is neither fractions of the picture, from 0 to 1, nor whole pixels");
  }
  const Face face = {left, top, right, bottom, inPixels};
  const std::string wrong = whatIsWrongWith(face);
  if (!wrong.empty()) refuse(wrong);
  return face;
}

}  // namespace

std::string whatIsWrongWith(const Face& face) {
  if (face.left > face.right)
    return "has its left side right of its right one; it is left,top,right,bottom";
  if (face.top > face.bottom) return "has its top below its bottom; it is left,top,right,bottom";
  const float end = face.inPixels ? std::numeric_limits<float>::infinity() : 1.0f;
  if (face.right < 0.0f || face.bottom < 0.0f || face.left >= end || face.top >= end)
    return "lies outside the picture";
  return "";
}

std::vector<Face> readFaces(const std::vector<std::string>& texts) {
  std::vector<Face> faces;
  for (const std::string& text : texts) faces.push_back(readFace(text));
  return faces;
}

}  // namespace pelorin::cli
