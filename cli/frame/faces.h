#pragma once

#include <string>
#include <vector>

#include "cli/frame/verb.h"
#include "photo/faces.h"

namespace pelorin::cli {

using photo::allFaces;
using photo::Face;
using photo::metadataWithFaces;

/// Adds `--face l,t,r,b`, repeatable, whose `texts` are for `readFaces`, and `--faces`.
/// @param source  where other faces come from: "xmp", the photo's file, or "none".
void addFaceOption(Verb verb, std::vector<std::string>& texts, std::string& source);

/// Four numbers are pixels when one is above 2, and fractions otherwise.
/// @throws UsageError when a text is not four finite numbers, when they are pixels and not all whole,
///         when left is right of right or top below bottom, and for fractions outside the picture.
std::vector<Face> readFaces(const std::vector<std::string>& texts);

}  // namespace pelorin::cli
