#include "jni/native_methods.h"

#include "platform/pnjni/environment.h"
#include "platform/pnjni/exceptions.h"
#include "platform/pnjni/local_reference.h"

namespace pelorin::quenby {

JNINativeMethod nativeMethod(const char* name, const char* signature, void* function) {
  // Some versions of jni.h want char*; nobody writes there.
  return {const_cast<char*>(name), const_cast<char*>(signature), function};
}

void registerNatives(const char* className, std::span<const JNINativeMethod> methods) {
  const jni::LocalReference<jclass> owner = jni::findClassLocal(className);
  const jint result = jni::Environment::current()->RegisterNatives(
      owner.get(), methods.data(), static_cast<jint>(methods.size()));
  jni::throwCppExceptionIf(result != 0);
}

}  // namespace pelorin::quenby
