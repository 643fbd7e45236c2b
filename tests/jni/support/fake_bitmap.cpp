#include "tests/jni/support/fake_bitmap.h"

#include <cstring>

namespace pelorin::test_support {

FakeBitmap::FakeBitmap(std::uint32_t width, std::uint32_t height, std::uint32_t padding)
    : info{width, height, width * 4 + padding, ANDROID_BITMAP_FORMAT_RGBA_8888, 0},
      bytes(std::size_t{info.stride} * height + 1, 0xEE) {}  // never a null pointer

FakeBitmap::FakeBitmap(const image_processing::Image<image_processing::RGBA8Pixel>& image,
                       std::uint32_t padding)
    : FakeBitmap(image.width, image.height, padding) {
  for (std::uint32_t y = 0; y < image.height; ++y)
    std::memcpy(bytes.data() + std::size_t{y} * info.stride, image.row(y), image.width * 4);
}

std::vector<std::uint8_t> FakeBitmap::packed() const {
  std::vector<std::uint8_t> pixels;
  for (std::uint32_t y = 0; y < info.height; ++y) {
    const auto row = bytes.begin() + static_cast<std::ptrdiff_t>(y) * info.stride;
    pixels.insert(pixels.end(), row, row + info.width * 4);
  }
  return pixels;
}

namespace {

FakeEnvironment& environmentOf(JNIEnv* env) {
  return *static_cast<FakeEnvironment*>(env);
}

FakeBitmap* bitmapOf(jobject reference) {
  return static_cast<FakeBitmap*>(reinterpret_cast<FakeObject*>(reference));
}

}  // namespace
}  // namespace pelorin::test_support

using pelorin::test_support::bitmapOf;
using pelorin::test_support::environmentOf;

int AndroidBitmap_getInfo(JNIEnv* env, jobject bitmap, AndroidBitmapInfo* info) {
  environmentOf(env).checkNothingPending("AndroidBitmap_getInfo");
  if (bitmap == nullptr) return ANDROID_BITMAP_RESULT_BAD_PARAMETER;
  if (environmentOf(env).shouldFail("AndroidBitmap_getInfo"))
    return ANDROID_BITMAP_RESULT_JNI_EXCEPTION;
  *info = bitmapOf(bitmap)->info;
  return bitmapOf(bitmap)->infoResult;
}

int AndroidBitmap_lockPixels(JNIEnv* env, jobject bitmap, void** pixels) {
  environmentOf(env).checkNothingPending("AndroidBitmap_lockPixels");
  // A result that nobody may look at: the call fails.
  *pixels = reinterpret_cast<void*>(0xBAD);
  if (bitmap == nullptr) return ANDROID_BITMAP_RESULT_BAD_PARAMETER;
  if (environmentOf(env).shouldFail("AndroidBitmap_lockPixels"))
    return ANDROID_BITMAP_RESULT_JNI_EXCEPTION;
  if (bitmapOf(bitmap)->lockResult != 0) return bitmapOf(bitmap)->lockResult;
  if (bitmapOf(bitmap)->heightOnceLocked != 0)
    bitmapOf(bitmap)->info.height = bitmapOf(bitmap)->heightOnceLocked;
  ++bitmapOf(bitmap)->locks;
  ++bitmapOf(bitmap)->timesLocked;
  *pixels = bitmapOf(bitmap)->bytes.data();
  return ANDROID_BITMAP_RESULT_SUCCESS;
}

int AndroidBitmap_unlockPixels(JNIEnv* env, jobject bitmap) {
  environmentOf(env).checkNothingPending("AndroidBitmap_unlockPixels");
  if (--bitmapOf(bitmap)->locks < 0)
    environmentOf(env).violate("unlocked too often", "AndroidBitmap_unlockPixels");
  return ANDROID_BITMAP_RESULT_SUCCESS;
}
