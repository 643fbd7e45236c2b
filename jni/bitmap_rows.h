#pragma once

#include <android/bitmap.h>

#include <cstddef>

#include "image_processing/core/image.h"
#include "jni/bitmap_pixels_lock.h"

namespace pelorin::quenby {

/// Asks what `bitmap` is. Returns false, with a line in the log, when that fails or when it is
/// nothing the natives work on: RGBA_8888 with rows of at least width x 4 bytes.
bool queryBitmap(JNIEnv* env, jobject bitmap, AndroidBitmapInfo& info);

/// The same for pixels that are locked: until then other threads may make another bitmap of it. Also
/// false, with a line in the log, when `lock` failed.
bool queryLockedBitmap(JNIEnv* env, jobject bitmap, const BitmapPixelsLock& lock,
                       AndroidBitmapInfo& info);

/// Copies rows of `rowBytes` bytes; rows may be farther apart than that on either side.
void copyRows(const void* from, std::size_t fromStride, void* to, std::size_t toStride,
              std::size_t rowBytes, std::size_t rows);

/// Copies the locked pixels of a bitmap, padding left out, into an image of its own.
/// @throws std::bad_alloc when it does not fit.
image_processing::Image<image_processing::RGBA8Pixel> copyOfPixels(const AndroidBitmapInfo& info,
                                                                   const void* pixels);

}  // namespace pelorin::quenby
