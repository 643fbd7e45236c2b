#pragma once

#include <cstdint>

#include "tests/support/pictures.h"

namespace pelorin::test_support {

/// What pictures are made of that a kernel's time may depend on.
enum class PictureKind {
  photo,      ///< `photoLikePicture`.
  detail,     ///< fine texture everywhere
  leaves,     ///< discs of all sizes that cover each other, as natural scenes do
  smooth,     ///< shading and a little grain, no corners
  oneColour,  ///< no two pixels differ
  noise,      ///< no two neighbours alike
};

/// A picture of the kind, the same every time.
Image<RGBA8Pixel> pictureOf(PictureKind kind, std::uint32_t width, std::uint32_t height);

/// "photo", "detail" and so on.
const char* nameOf(PictureKind kind);

}  // namespace pelorin::test_support
