#pragma once

#include <gtest/gtest.h>

#include "tests/support/float_images.h"

namespace pelorin::test_support {

/// A dark half beside a light one, about 0.12 and 0.92, with a little noise.
inline image_processing::Image<float> noisyEdge() {
  image_processing::Image<float> image = randomImage(60, 60, 8);
  for (std::uint32_t y = 0; y < 60; ++y) {
    for (std::uint32_t x = 0; x < 60; ++x) {
      image.row(y)[x] = (x < 30 ? 0.1f : 0.9f) + 0.04f * image.row(y)[x];
    }
  }
  return image;
}

/// That a smoothing of `noisyEdge` kept the edge and smoothed what lies beside it.
inline void expectSmoothedBesideTheEdge(const image_processing::Image<float>& smoothed) {
  EXPECT_NEAR(smoothed.row(30)[29], 0.12f, 0.02f);
  EXPECT_NEAR(smoothed.row(30)[30], 0.92f, 0.02f);
  for (std::uint32_t x = 5; x < 25; ++x) EXPECT_NEAR(smoothed.row(30)[x], 0.12f, 0.015f);
}

}  // namespace pelorin::test_support
