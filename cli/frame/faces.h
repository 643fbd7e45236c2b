#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "cli/frame/verb.h"
#include "image_processing/core/image_metadata.h"

namespace pelorin::cli {

/// A face box as fractions of the upright picture; may lie outside it.
struct FaceFractions {
  float left, top, right, bottom;
};

/// Adds `--face l,t,r,b`, repeatable; `texts` is for `readFaces`.
void addFaceOption(Verb verb, std::vector<std::string>& texts);

/// @throws UsageError when a text is not four finite numbers.
std::vector<FaceFractions> readFaces(const std::vector<std::string>& texts);

/// The boxes in pixels of a picture of this size: fraction times size in float, truncated, with no
/// clamping, as the Java natives do it.
image_processing::ImageMetadata metadataWithFaces(const std::vector<FaceFractions>& faces,
                                                  std::uint32_t width, std::uint32_t height);

}  // namespace pelorin::cli
