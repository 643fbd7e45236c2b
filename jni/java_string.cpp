#include "jni/java_string.h"

#include <new>

namespace pelorin::quenby {

JavaCharacters::JavaCharacters(JNIEnv* env, jstring text)
    : env_(env), text_(text), characters_(env->GetStringUTFChars(text, nullptr)) {
  if (characters_ == nullptr) throw std::bad_alloc();
}

std::string toString(JNIEnv* env, jstring text) {
  return text == nullptr ? std::string() : std::string(JavaCharacters(env, text).get());
}

}  // namespace pelorin::quenby
