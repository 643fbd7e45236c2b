#include "platform/pnjni/environment.h"
#include "platform/pnjni/exceptions.h"
#include "platform/pnjni/local_reference.h"

// What the natives may ask a device's libpnjni for.

namespace pelorin::jni {

jint initialize(JavaVM*, void (*)()) {
  return JNI_ERR;
}

JNIEnv* Environment::current() {
  return nullptr;
}

LocalReference<jclass> findClassLocal(const char*) {
  return {nullptr, nullptr};
}

void throwCppExceptionIf(bool) {}

void translatePendingCppExceptionToJavaException() noexcept {}

}  // namespace pelorin::jni
