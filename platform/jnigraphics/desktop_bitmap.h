#pragma once

#include <jni.h>

namespace pelorin::jnigraphics {

/// The members of the desktop's android.graphics.Bitmap that this library stands on. They are
/// looked up anew each time: several class loaders may each have a Bitmap class of their own.
/// A function that returns false leaves a Java exception pending.
class DesktopBitmap {
 public:
  DesktopBitmap(JNIEnv* env, jobject bitmap);
  ~DesktopBitmap();
  DesktopBitmap(const DesktopBitmap&) = delete;
  DesktopBitmap& operator=(const DesktopBitmap&) = delete;

  bool readInt(const char* field, jint& value) const;

  /// Locks the pixels. `buffer` is a local reference to the direct buffer that holds them, or null
  /// when the bitmap is recycled, which locks nothing.
  bool lock(jobject& buffer) const;
  bool unlock() const;

 private:
  JNIEnv* env_;
  jobject bitmap_;
  jclass class_;
};

}  // namespace pelorin::jnigraphics
