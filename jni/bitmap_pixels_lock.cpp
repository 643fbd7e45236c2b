#include "jni/bitmap_pixels_lock.h"

#include <android/bitmap.h>

namespace pelorin::quenby {

BitmapPixelsLock::BitmapPixelsLock(JNIEnv* env, jobject bitmap)
    : env_(env), bitmap_(bitmap), pixels_(nullptr) {
  if (AndroidBitmap_lockPixels(env, bitmap, &pixels_) != ANDROID_BITMAP_RESULT_SUCCESS)
    pixels_ = nullptr;
}

BitmapPixelsLock::~BitmapPixelsLock() {
  if (pixels_ == nullptr) return;
  // Unlocking may call into Java, which is not allowed while an exception is pending.
  const jthrowable pending = env_->ExceptionOccurred();
  if (pending != nullptr) env_->ExceptionClear();
  AndroidBitmap_unlockPixels(env_, bitmap_);
  if (pending == nullptr) return;
  env_->Throw(pending);
  env_->DeleteLocalRef(pending);
}

}  // namespace pelorin::quenby
