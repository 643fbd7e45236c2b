#include "jni/bitmap_rows.h"

#include <cstring>

#include "jni/log.h"

namespace pelorin::quenby {

using image_processing::Image;
using image_processing::RGBA8Pixel;

bool queryBitmap(JNIEnv* env, jobject bitmap, AndroidBitmapInfo& info) {
  const int result = AndroidBitmap_getInfo(env, bitmap, &info);
  if (result != ANDROID_BITMAP_RESULT_SUCCESS) {
    pn_printLog(logError, logTag, "AndroidBitmap_getInfo failed: %d", result);
    return false;
  }
  if (info.format != ANDROID_BITMAP_FORMAT_RGBA_8888) {
    pn_printLog(logError, logTag, "bitmap format %d is not RGBA_8888", info.format);
    return false;
  }
  if (info.stride / sizeof(RGBA8Pixel) < info.width) {
    pn_printLog(logError, logTag, "bitmap stride %u is too small for width %u", info.stride,
                info.width);
    return false;
  }
  return true;
}

bool queryLockedBitmap(JNIEnv* env, jobject bitmap, const BitmapPixelsLock& lock,
                       AndroidBitmapInfo& info) {
  if (lock.pixels() == nullptr) {
    pn_printLog(logError, logTag, "AndroidBitmap_lockPixels failed");
    return false;
  }
  return queryBitmap(env, bitmap, info);
}

void copyRows(const void* from, std::size_t fromStride, void* to, std::size_t toStride,
              std::size_t rowBytes, std::size_t rows) {
  if (fromStride == rowBytes && toStride == rowBytes) {
    std::memcpy(to, from, rowBytes * rows);
    return;
  }
  const auto* source = static_cast<const char*>(from);
  auto* target = static_cast<char*>(to);
  for (std::size_t row = 0; row < rows; ++row)
    std::memcpy(target + row * toStride, source + row * fromStride, rowBytes);
}

Image<RGBA8Pixel> copyOfPixels(const AndroidBitmapInfo& info, const void* pixels) {
  Image<RGBA8Pixel> image(info.width, info.height);
  const std::size_t rowBytes = info.width * sizeof(RGBA8Pixel);
  copyRows(pixels, info.stride, image.data.get(), rowBytes, rowBytes, info.height);
  return image;
}

}  // namespace pelorin::quenby
