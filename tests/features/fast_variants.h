#pragma once

#include <array>
#include <cstdlib>
#include <vector>

#include "image_processing/features/fast.h"
#include "tests/support/grey_pictures.h"

namespace pelorin::test_support {

/// The four functions of one N.
struct FastVariant {
  int arc;
  decltype(&fast9_detect) detect;
  decltype(&fast9_corner_score) cornerScore;
  decltype(&fast9_score) score;
  decltype(&fast9_detect_nonmax) detectNonmax;
};

inline const std::array<FastVariant, 4> fastVariants = {{
    {9, fast9_detect, fast9_corner_score, fast9_score, fast9_detect_nonmax},
    {10, fast10_detect, fast10_corner_score, fast10_score, fast10_detect_nonmax},
    {11, fast11_detect, fast11_corner_score, fast11_score, fast11_detect_nonmax},
    {12, fast12_detect, fast12_corner_score, fast12_score, fast12_detect_nonmax},
}};

/// The elements of an array from `malloc`, which is freed.
template <typename T>
std::vector<T> take(T* array, int count) {
  std::vector<T> elements(array, array + count);
  std::free(array);
  return elements;
}

inline std::vector<xy> detect(decltype(&fast9_detect) detector, const GreyImage& image, int b) {
  const int width = static_cast<int>(image.width), height = static_cast<int>(image.height);
  int count = -1;
  xy* const corners = detector(image.data.get(), width, height, width, b, &count);
  return take(corners, count);
}

inline std::vector<int> score(const FastVariant& variant, const GreyImage& image,
                              const std::vector<xy>& corners, int b) {
  const int count = static_cast<int>(corners.size());
  const int width = static_cast<int>(image.width);
  return take(variant.score(image.data.get(), width, corners.data(), count, b), count);
}

inline std::vector<xy> suppress(const std::vector<xy>& corners, const std::vector<int>& scores) {
  int kept = -1;
  xy* const maxima =
      nonmax_suppression(corners.data(), scores.data(), static_cast<int>(corners.size()), &kept);
  return take(maxima, kept);
}

}  // namespace pelorin::test_support
