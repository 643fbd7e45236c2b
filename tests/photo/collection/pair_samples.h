#pragma once

#include <string>
#include <vector>

#include "image_processing/core/image.h"
#include "photo/collection/pair_search.h"

namespace pelorin::test_support {

using Picture = image_processing::Image<image_processing::RGBA8Pixel>;

/// Pairs of one kind, each compared as `quenby dupes` compares files: coded as JPEG and read again.
struct PairSamples {
  std::string name;  ///< "crop, 90 % of each side".
  bool isDuplicate;  ///< Whether they are two pictures of one scene.
  bool isCopy;       ///< Whether they are of one shot, so that their times are the same.
  std::vector<photo::ShotPair> pairs;
};

/// True pairs made of each scene: copies that were coded again, made smaller, cropped, turned or
/// enhanced, and shots of bursts, which move, change exposure, have noise of their own and something
/// that walks through them; and false ones: every two scenes, and parts of one scene beside each
/// other, seconds apart.
/// @param scenes  unrelated pictures, at least two, each side 64 or more.
std::vector<PairSamples> pairSamples(const std::vector<Picture>& scenes);

}  // namespace pelorin::test_support
