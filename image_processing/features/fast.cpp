#include "image_processing/features/fast.h"

#include <limits>
#include <new>

#include "image_processing/features/fast_corner.h"
#include "image_processing/features/fast_detector.h"

namespace pelorin::image_processing {
namespace {

// The array `make` returns, as C callers get it.
template <typename Make>
auto* handOver(Make make, int* count) {
  using Pointer = decltype(make().release());
  *count = 0;
  try {
    auto array = make();
    if (array.size() > std::numeric_limits<int>::max()) return Pointer{nullptr};
    *count = static_cast<int>(array.size());
    return array.release();
  } catch (const std::bad_alloc&) {
    return Pointer{nullptr};
  }
}

xy* detect(int arc, const GreyPixels& image, int b, int* count) {
  return handOver([&] { return detectCorners(image, arc, b); }, count);
}

xy* detectNonmax(int arc, const GreyPixels& image, int b, int* count) {
  return handOver([&] { return detectMaxima(image, arc, b); }, count);
}

int* score(int arc, const unsigned char* pixels, int stride, const xy* corners, int count, int b) {
  if (count > 0 && (pixels == nullptr || corners == nullptr)) return nullptr;
  const std::size_t size = count > 0 ? static_cast<std::size_t>(count) : 0;
  const GreyPixels image = {pixels, 0, 0, stride};
  return handOver([&] { return scoreCorners(image, corners, size, arc, b); }, &count);
}

int scoreOne(int arc, const unsigned char* centre, const int* offsets, int b) {
  CircleValues circle;
  for (std::size_t i = 0; i < circle.size(); ++i) circle[i] = centre[offsets[i]];
  return cornerScore(*centre, circle, arc, b);
}

}  // namespace
}  // namespace pelorin::image_processing

namespace engine = pelorin::image_processing;

// The four functions of one N.
#define PELORIN_FAST(N)                                                                       \
  xy* fast##N##_detect(const unsigned char* pixels, int xsize, int ysize, int stride, int b,  \
                       int* count) {                                                          \
    return engine::detect(N, {pixels, xsize, ysize, stride}, b, count);                       \
  }                                                                                           \
  int fast##N##_corner_score(const unsigned char* centre, const int* offsets, int b) {        \
    return engine::scoreOne(N, centre, offsets, b);                                           \
  }                                                                                           \
  int* fast##N##_score(const unsigned char* pixels, int stride, const xy* corners, int count, \
                       int b) {                                                               \
    return engine::score(N, pixels, stride, corners, count, b);                               \
  }                                                                                           \
  xy* fast##N##_detect_nonmax(const unsigned char* pixels, int xsize, int ysize, int stride,  \
                              int b, int* count) {                                            \
    return engine::detectNonmax(N, {pixels, xsize, ysize, stride}, b, count);                 \
  }

PELORIN_FAST(9)
PELORIN_FAST(10)
PELORIN_FAST(11)
PELORIN_FAST(12)

xy* nonmax_suppression(const xy* corners, const int* scores, int count, int* kept) {
  const bool none = count <= 0 || corners == nullptr || scores == nullptr;
  const std::size_t size = none ? 0 : static_cast<std::size_t>(count);
  return engine::handOver([&] { return engine::keepMaxima(corners, scores, size); }, kept);
}
