#include "platform/jnigraphics/desktop_bitmap.h"

namespace pelorin::jnigraphics {

DesktopBitmap::DesktopBitmap(JNIEnv* env, jobject bitmap)
    : env_(env), bitmap_(bitmap), class_(env->GetObjectClass(bitmap)) {}

DesktopBitmap::~DesktopBitmap() {
  env_->DeleteLocalRef(class_);
}

bool DesktopBitmap::readInt(const char* field, jint& value) const {
  const jfieldID id = env_->GetFieldID(class_, field, "I");
  if (id == nullptr) return false;
  value = env_->GetIntField(bitmap_, id);
  return true;
}

bool DesktopBitmap::lock(jobject& buffer) const {
  const jmethodID method = env_->GetMethodID(class_, "lockPixels", "()Ljava/nio/ByteBuffer;");
  if (method == nullptr) return false;
  buffer = env_->CallObjectMethod(bitmap_, method);
  return !env_->ExceptionCheck();
}

bool DesktopBitmap::unlock() const {
  const jmethodID method = env_->GetMethodID(class_, "unlockPixels", "()V");
  if (method == nullptr) return false;
  env_->CallVoidMethod(bitmap_, method);
  return !env_->ExceptionCheck();
}

}  // namespace pelorin::jnigraphics
