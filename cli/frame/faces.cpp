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

// No face is twice as far to the right as the picture is wide.
constexpr float largestFraction = 2.0f;

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
  const bool inPixels = std::ranges::max(bounds) > largestFraction;
  if (inPixels && !std::ranges::all_of(bounds, [](float b) { return b == std::trunc(b); })) {
    refuse("is neither fractions of the picture, from 0 to 1, nor whole pixels");
  }
  if (left > right) refuse("has its left side right of its right one; it is left,top,right,bottom");
  if (top > bottom) refuse("has its top below its bottom; it is left,top,right,bottom");
  const float end = inPixels ? std::numeric_limits<float>::infinity() : 1.0f;
  if (right < 0.0f || bottom < 0.0f || left >= end || top >= end) {
    refuse("lies outside the picture");
  }
  return {left, top, right, bottom, inPixels};
}

}  // namespace

void addFaceOption(Verb verb, std::vector<std::string>& texts, std::string& source) {
  verb.option("--face", texts,
              "A face as left,top,right,bottom of the upright picture, in fractions (0,0 its top "
              "left corner, 1,1 the opposite one) or, when a number is above 2, in pixels of its "
              "full size; may be repeated")
      .oneValueEach()
      .type("L,T,R,B");
  verb.option("--faces", source,
              "Use the faces that the photo's XMP knows of, or none; xmp unless given. --face adds "
              "to them")
      .oneOf({"xmp", "none"});
}

std::vector<Face> readFaces(const std::vector<std::string>& texts) {
  std::vector<Face> faces;
  for (const std::string& text : texts) faces.push_back(readFace(text));
  return faces;
}

}  // namespace pelorin::cli
