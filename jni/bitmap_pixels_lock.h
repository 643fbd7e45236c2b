#pragma once

#include <jni.h>

namespace pelorin::quenby {

/// Locks the pixels of a Java bitmap for a scope.
class BitmapPixelsLock {
 public:
  BitmapPixelsLock(JNIEnv* env, jobject bitmap);
  /// Unlocks, unless locking failed. A pending Java exception stays pending.
  ~BitmapPixelsLock();
  BitmapPixelsLock(const BitmapPixelsLock&) = delete;
  BitmapPixelsLock& operator=(const BitmapPixelsLock&) = delete;

  /// The first row's first byte; null when locking failed, which is the caller's to report.
  void* pixels() const { return pixels_; }

 private:
  JNIEnv* env_;
  jobject bitmap_;
  void* pixels_;
};

}  // namespace pelorin::quenby
