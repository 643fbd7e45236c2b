#include <limits>
#include <vector>

#include "bindings/c/given_array.h"
#include "bindings/c/pixels.h"
#include "image_processing/dupe/grayscale.h"
#include "image_processing/features/brief.h"
#include "image_processing/features/fast_detector.h"

using namespace pelorin;
using namespace pelorin::c_api;
using namespace pelorin::image_processing;

int32_t quenby_grey_of(const quenby_pixels* pixels, uint8_t* grey, size_t stride,
                       quenby_error* error) {
  return guarded(error, [&] {
    const auto picture = viewOf(pixels);
    requireRows(grey, picture->width, picture->height, stride, 1, "grey");
    const GreyPicture made = imageMakeGrayscale(*picture);
    for (uint32_t y = 0; y < made.height; ++y) {
      std::copy_n(made.row(y), made.width, grey + y * stride);
    }
  });
}

int32_t quenby_fast(const quenby_grey* grey, int32_t arc, int32_t threshold, int32_t suppress,
                    quenby_corners* corners, quenby_error* error) {
  if (corners != nullptr) *corners = {};
  return guarded(error, [&] {
    required(corners, "corners");
    if (arc < 9 || arc > 12) refuse("arc", "is not 9, 10, 11 or 12");
    const GreyPicture picture = viewOf(grey);
    const GreyPixels pixels = {picture.data.get(), static_cast<int>(picture.width),
                               static_cast<int>(picture.height),
                               static_cast<std::ptrdiff_t>(picture.width)};
    const auto found = suppress != 0 ? detectMaxima(pixels, arc, threshold)
                                     : detectCorners(pixels, arc, threshold);
    const auto scores = scoreCorners(pixels, found.data(), found.size(), arc, threshold);
    std::vector<quenby_corner> given(found.size());
    for (size_t i = 0; i < given.size(); ++i) {
      given[i] = {found.data()[i].x, found.data()[i].y, scores.data()[i]};
    }
    *corners = {givenArray<quenby_corner>(given), given.size()};
  });
}

void quenby_corners_free(quenby_corners* corners) {
  freeArray(corners);
}

int32_t quenby_brief(const quenby_grey* grey, const quenby_corner* corners, size_t count,
                     quenby_descriptors* descriptors, quenby_error* error) {
  if (descriptors != nullptr) *descriptors = {};
  return guarded(error, [&] {
    required(descriptors, "descriptors");
    array(corners, count, "corners");
    if (count > size_t{std::numeric_limits<int>::max()}) refuse("count", "is above 2147483647");
    std::vector<xy> positions(count);
    for (size_t i = 0; i < count; ++i) positions[i] = {corners[i].x, corners[i].y};
    std::vector<BriefDescriptor> found;
    brief(positions.data(), static_cast<int>(count), viewOf(grey), found);
    std::vector<quenby_descriptor> given(found.size());
    for (size_t i = 0; i < given.size(); ++i) {
      given[i].x = found[i].center.x;
      given[i].y = found[i].center.y;
      std::copy(found[i].descriptor.begin(), found[i].descriptor.end(), given[i].words);
    }
    *descriptors = {givenArray<quenby_descriptor>(given), given.size()};
  });
}

void quenby_descriptors_free(quenby_descriptors* descriptors) {
  freeArray(descriptors);
}
