#include <cmath>
#include <memory>

#include "image_processing/dupe/dupe_score.h"
#include "jni/bitmap_rows.h"
#include "jni/load_time_cache.h"
#include "jni/natives.h"

namespace pelorin::quenby {

using image_processing::Image;
using image_processing::RGBA8Pixel;

namespace {

/// An image over locked pixels, without a copy unless rows are padded.
Image<RGBA8Pixel> imageOver(const AndroidBitmapInfo& info, void* pixels) {
  if (info.stride != info.width * sizeof(RGBA8Pixel)) return copyOfPixels(info, pixels);
  const auto bitmapOwnsThem = [](RGBA8Pixel*) {};
  return {info.width, info.height,
          std::shared_ptr<RGBA8Pixel>(static_cast<RGBA8Pixel*>(pixels), bitmapOwnsThem)};
}

}  // namespace

jfloat similarityScore(JNIEnv* env, jobject, jobject bitmap1, jdouble time1, jint orientation1,
                       jobject bitmap2, jdouble time2, jint orientation2) {
  AndroidBitmapInfo info1, info2;
  if (!queryBitmap(env, bitmap1, info1)) return loadTimeCache.similarityError;
  const BitmapPixelsLock lock1(env, bitmap1);
  if (!queryLockedBitmap(env, bitmap1, lock1, info1)) return loadTimeCache.similarityError;
  if (!queryBitmap(env, bitmap2, info2)) return loadTimeCache.similarityError;
  const BitmapPixelsLock lock2(env, bitmap2);
  if (!queryLockedBitmap(env, bitmap2, lock2, info2)) return loadTimeCache.similarityError;
  const Image<RGBA8Pixel> image1 = imageOver(info1, lock1.pixels());
  const Image<RGBA8Pixel> image2 = imageOver(info2, lock2.pixels());
  const auto dt = static_cast<float>(std::fabs(time1 - time2));
  return dupeStatisticTimeOrientationExposureInvariantKS(image1, image2, dt,
                                                         orientation1 == orientation2);
}

}  // namespace pelorin::quenby
