#pragma once

#include <cstdint>

#include "image_processing/core/image.h"

namespace pelorin::bench {

/// What a picture is made of decides how long corners take.
enum GreyPicture {
  detail,  ///< fine texture everywhere
  leaves,  ///< discs of all sizes that cover each other, as natural scenes do
  smooth,  ///< shading and a little grain, no corners
  photo,   ///< the green channel of the picture of the other benchmarks
};

/// A picture of 4000 x 3000 pixels of the kind, the same every time.
image_processing::Image<unsigned char> greyPicture(GreyPicture kind);

/// "detail", "leaves", "smooth" or "photo".
const char* nameOf(GreyPicture kind);

}  // namespace pelorin::bench
