#include "cli/verbs/corners.h"

#include <fmt/format.h>

#include "image_processing/features/fast_detector.h"

namespace pelorin::cli {

using image_processing::BriefDescriptor;
using image_processing::GreyPixels;
using image_processing::Image;

std::vector<Corner> findCorners(const Image<unsigned char>& grey, const CornerSearch& search) {
  const GreyPixels pixels = {grey.data.get(), static_cast<int>(grey.width),
                             static_cast<int>(grey.height), grey.width};
  const auto found = search.suppressed ? detectMaxima(pixels, search.arc, search.threshold)
                                       : detectCorners(pixels, search.arc, search.threshold);
  const auto scores =
      scoreCorners(pixels, found.data(), found.size(), search.arc, search.threshold);
  std::vector<Corner> corners;
  for (std::size_t i = 0; i < found.size(); ++i) {
    corners.push_back({found.data()[i], scores.data()[i], std::nullopt});
  }
  if (!search.described) return corners;

  std::vector<BriefDescriptor> descriptors;
  image_processing::brief(found.data(), static_cast<int>(found.size()), grey, descriptors);
  auto corner = corners.begin();
  for (const BriefDescriptor& described : descriptors) {
    while (corner->position != described.center) ++corner;
    corner->descriptor = described.descriptor;
  }
  return corners;
}

std::string hexOf(const Descriptor& descriptor) {
  std::string digits;
  for (auto word = descriptor.rbegin(); word != descriptor.rend(); ++word) {
    digits += fmt::format("{:08x}", *word);
  }
  return digits;
}

}  // namespace pelorin::cli
