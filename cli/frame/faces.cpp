#include "cli/frame/faces.h"

#include <array>
#include <memory>
#include <string_view>

#include "cli/frame/errors.h"
#include "cli/frame/number_text.h"
#include "image_processing/core/float_to_integer.h"

namespace pelorin::cli {
namespace {

using image_processing::BoundingBox;
using image_processing::truncateTo;

FaceFractions readFace(const std::string& text) {
  std::array<float, 4> bounds;
  std::string_view rest = text;
  for (std::size_t i = 0; i < bounds.size(); ++i) {
    const std::size_t comma = rest.find(',');
    if ((comma == std::string_view::npos) != (i + 1 == bounds.size())) {
      throw UsageError("--face: '" + text +
                       "' is not left,top,right,bottom, for example 0.4,0.1,0.6,0.4");
    }
    bounds[i] = readFiniteNumber("--face", rest.substr(0, comma));
    if (comma != std::string_view::npos) rest.remove_prefix(comma + 1);
  }
  return {bounds[0], bounds[1], bounds[2], bounds[3]};
}

}  // namespace

void addFaceOption(Verb verb, std::vector<std::string>& texts) {
  verb.option("--face", texts,
              "A face as left,top,right,bottom in fractions of the upright picture, "
              "0,0 its top left corner; may be repeated")
      .oneValueEach()
      .type("L,T,R,B");
}

std::vector<FaceFractions> readFaces(const std::vector<std::string>& texts) {
  std::vector<FaceFractions> faces;
  for (const std::string& text : texts) faces.push_back(readFace(text));
  return faces;
}

image_processing::ImageMetadata metadataWithFaces(const std::vector<FaceFractions>& faces,
                                                  std::uint32_t width, std::uint32_t height) {
  image_processing::ImageMetadata metadata;
  const auto columns = static_cast<float>(width), rows = static_cast<float>(height);
  for (const FaceFractions& face : faces) {
    BoundingBox box = {};
    box.left = truncateTo<std::int32_t>(face.left * columns);
    box.right = truncateTo<std::int32_t>(face.right * columns);
    box.top = truncateTo<std::int32_t>(face.top * rows);
    box.bottom = truncateTo<std::int32_t>(face.bottom * rows);
    metadata.faces.push_back(std::make_shared<BoundingBox>(box));
  }
  return metadata;
}

}  // namespace pelorin::cli
