#include <android/bitmap.h>

#include "platform/jnigraphics/desktop_bitmap.h"

using pelorin::jnigraphics::DesktopBitmap;

int AndroidBitmap_getInfo(JNIEnv* env, jobject bitmap, AndroidBitmapInfo* info) {
  if (bitmap == nullptr || info == nullptr) return ANDROID_BITMAP_RESULT_BAD_PARAMETER;
  const DesktopBitmap desktop(env, bitmap);
  jint width, height, stride, format;
  if (!desktop.readInt("width", width) || !desktop.readInt("height", height) ||
      !desktop.readInt("stride", stride) || !desktop.readInt("format", format))
    return ANDROID_BITMAP_RESULT_JNI_EXCEPTION;
  *info = {static_cast<uint32_t>(width), static_cast<uint32_t>(height),
           static_cast<uint32_t>(stride), format, 0};
  return ANDROID_BITMAP_RESULT_SUCCESS;
}

int AndroidBitmap_lockPixels(JNIEnv* env, jobject bitmap, void** pixels) {
  if (bitmap == nullptr || pixels == nullptr) return ANDROID_BITMAP_RESULT_BAD_PARAMETER;
  *pixels = nullptr;
  const DesktopBitmap desktop(env, bitmap);
  jobject buffer;
  if (!desktop.lock(buffer)) return ANDROID_BITMAP_RESULT_JNI_EXCEPTION;
  if (buffer == nullptr) return ANDROID_BITMAP_RESULT_BAD_PARAMETER;  // recycled
  *pixels = env->GetDirectBufferAddress(buffer);
  env->DeleteLocalRef(buffer);
  if (*pixels != nullptr) return ANDROID_BITMAP_RESULT_SUCCESS;
  desktop.unlock();
  return ANDROID_BITMAP_RESULT_ALLOCATION_FAILED;
}

int AndroidBitmap_unlockPixels(JNIEnv* env, jobject bitmap) {
  if (bitmap == nullptr) return ANDROID_BITMAP_RESULT_BAD_PARAMETER;
  return DesktopBitmap(env, bitmap).unlock() ? ANDROID_BITMAP_RESULT_SUCCESS
                                             : ANDROID_BITMAP_RESULT_JNI_EXCEPTION;
}
