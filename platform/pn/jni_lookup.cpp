#include "platform/pn/jni_lookup.h"

#include <cstdarg>
#include <cstdio>
#include <string>

namespace pelorin {

jclass findClassOrThrow(JNIEnv* env, const char* name) {
  const jclass found = env->FindClass(name);
  if (found == nullptr) throw JniError(std::string("no Java class ") + name);
  return found;
}

jfieldID getFieldIdOrThrow(JNIEnv* env, jclass owner, const char* name, const char* signature) {
  const jfieldID found = env->GetFieldID(owner, name, signature);
  if (found == nullptr) throw JniError(std::string("no Java field ") + name + " " + signature);
  return found;
}

void throwOutOfMemoryError(JNIEnv* env, const char* format, ...) {
  if (env->ExceptionCheck()) return;
  char message[256];
  va_list arguments;
  va_start(arguments, format);
  vsnprintf(message, sizeof(message), format, arguments);
  va_end(arguments);
  const jclass error = env->FindClass("java/lang/OutOfMemoryError");
  if (error == nullptr) return;  // then its own exception is pending
  env->ThrowNew(error, message);
  env->DeleteLocalRef(error);
}

}  // namespace pelorin
