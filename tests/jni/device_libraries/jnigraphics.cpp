#include <android/bitmap.h>

// What the natives may ask a device's libjnigraphics for.

int AndroidBitmap_getInfo(JNIEnv*, jobject, AndroidBitmapInfo*) {
  return ANDROID_BITMAP_RESULT_BAD_PARAMETER;
}

int AndroidBitmap_lockPixels(JNIEnv*, jobject, void**) {
  return ANDROID_BITMAP_RESULT_BAD_PARAMETER;
}

int AndroidBitmap_unlockPixels(JNIEnv*, jobject) {
  return ANDROID_BITMAP_RESULT_BAD_PARAMETER;
}
