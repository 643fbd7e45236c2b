#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "cli/frame/verb.h"
#include "image_processing/core/face_fractions.h"
#include "image_processing/core/image_metadata.h"
#include "photo/photo.h"

namespace pelorin::cli {

/// A face as the user drew it: a box of which some part may lie outside the upright picture.
struct Face {
  float left, top, right, bottom;
  bool inPixels;  ///< Of the picture at its full size; fractions of it otherwise.
};

/// Adds `--face l,t,r,b`, repeatable, whose `texts` are for `readFaces`, and `--faces`.
/// @param source  where other faces come from: "xmp", the photo's file, or "none".
void addFaceOption(Verb verb, std::vector<std::string>& texts, std::string& source);

/// Four numbers are pixels when one is above 2, and fractions otherwise.
/// @throws UsageError when a text is not four finite numbers, when they are pixels and not all whole,
///         when left is right of right or top below bottom, and for fractions outside the picture.
std::vector<Face> readFaces(const std::vector<std::string>& texts);

/// The user's faces, then those that the photo's file knows of and that touch the picture.
std::vector<Face> allFaces(std::vector<Face> faces, const photo::Photo& photo);

/// The boxes in pixels of a picture of this size. Fractions are multiplied by it in float and
/// truncated, with no clamping, as the Java natives do it.
/// @param scale  how often smaller the picture was decoded than it is.
/// @throws FileError for a box in pixels that lies outside the picture.
image_processing::ImageMetadata metadataWithFaces(const std::vector<Face>& faces,
                                                  std::uint32_t width, std::uint32_t height,
                                                  int scale = 1);

}  // namespace pelorin::cli
