#pragma once

#include <jni.h>
#include <stdint.h>

// The bitmap interface of the platform, as far as it is used here. A device build takes the
// platform's own header of this name.

extern "C" {

enum {
  ANDROID_BITMAP_RESULT_SUCCESS = 0,
  ANDROID_BITMAP_RESULT_BAD_PARAMETER = -1,
  ANDROID_BITMAP_RESULT_JNI_EXCEPTION = -2,
  ANDROID_BITMAP_RESULT_ALLOCATION_FAILED = -3,
};

enum AndroidBitmapFormat {
  ANDROID_BITMAP_FORMAT_NONE = 0,
  ANDROID_BITMAP_FORMAT_RGBA_8888 = 1,
  ANDROID_BITMAP_FORMAT_RGB_565 = 4,
  ANDROID_BITMAP_FORMAT_RGBA_4444 = 7,
  ANDROID_BITMAP_FORMAT_A_8 = 8,
};

typedef struct {
  uint32_t width;   ///< In pixels.
  uint32_t height;  ///< In pixels.
  uint32_t stride;  ///< Bytes from one row to the next.
  int32_t format;   ///< One of AndroidBitmapFormat.
  uint32_t flags;   ///< Nothing on a desktop.
} AndroidBitmapInfo;

/// What `bitmap` is. A negative result says that it cannot be told: no bitmap, or a Java exception,
/// which is then pending.
int AndroidBitmap_getInfo(JNIEnv* env, jobject bitmap, AndroidBitmapInfo* info);

/// The first pixel of `bitmap`, which stays where it is until as many unlocks as locks. A negative
/// result: no bitmap, a recycled one, or a Java exception, which is then pending.
int AndroidBitmap_lockPixels(JNIEnv* env, jobject bitmap, void** pixels);

int AndroidBitmap_unlockPixels(JNIEnv* env, jobject bitmap);
}
