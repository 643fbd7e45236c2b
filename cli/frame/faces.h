#pragma once

#include <string>
#include <vector>

#include "photo/faces.h"

namespace pelorin::cli {

using photo::allFaces;
using photo::Face;
using photo::metadataWithFaces;

/// No face is twice as far to the right as the picture is wide.
constexpr float largestFaceFraction = 2.0f;

/// What is wrong with a face, one clause: it is upside down, or fractions put it outside the
/// picture. Empty when nothing is.
std::string whatIsWrongWith(const Face& face);

/// Four numbers are pixels when one is above 2, and fractions otherwise.
/// @throws UsageError when a text is not four finite numbers, when they are pixels and not all whole,
///         when left is right of right or top below bottom, and for fractions outside the picture.
std::vector<Face> readFaces(const std::vector<std::string>& texts);

}  // namespace pelorin::cli
