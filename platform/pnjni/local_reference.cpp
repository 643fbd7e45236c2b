#include "platform/pnjni/local_reference.h"

#include "platform/pn/jni_lookup.h"
#include "platform/pnjni/environment.h"

namespace pelorin::jni {

LocalReference<jclass> findClassLocal(const char* name) {
  JNIEnv* const env = Environment::current();
  return {env, findClassOrThrow(env, name)};
}

}  // namespace pelorin::jni
