#pragma once

#include <jni.h>

#include <cstdint>

#include "image_processing/core/image_metadata.h"

namespace pelorin::quenby {

/// Appends the face rectangles, RectF objects in fractions of the image's size, as boxes in pixels,
/// truncated toward zero. Null elements are skipped, and a null array holds no faces; rectangles
/// outside the image or reversed are taken as they are, NaN is 0.
/// @throws std::bad_alloc, and JniError when Java raised an exception, which is then pending.
void addFaceboxes(JNIEnv* env, jobjectArray faces, std::uint32_t width, std::uint32_t height,
                  image_processing::ImageMetadata& metadata);

}  // namespace pelorin::quenby
