#include "platform/pnjni/environment.h"

#include <atomic>

#include "platform/pn/jni_lookup.h"
#include "platform/pnjni/exceptions.h"

namespace pelorin::jni {
namespace {

constexpr jint requiredVersion = JNI_VERSION_1_6;
std::atomic<JavaVM*> machine = nullptr;

}  // namespace

jint initialize(JavaVM* vm, void (*onLoad)()) {
  machine = vm;
  try {
    onLoad();
    return requiredVersion;
  } catch (...) {
    translatePendingCppExceptionToJavaException();
    return JNI_ERR;
  }
}

JNIEnv* Environment::current() {
  void* env = nullptr;
  JavaVM* const vm = machine;
  if (vm == nullptr || vm->GetEnv(&env, requiredVersion) != JNI_OK)
    throw JniError("this thread is unknown to the virtual machine");
  return static_cast<JNIEnv*>(env);
}

}  // namespace pelorin::jni
