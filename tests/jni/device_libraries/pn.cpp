#include "platform/pn/jni_lookup.h"
#include "platform/pn/log.h"

// What the natives may ask a device's libpn for.

void pn_printLog(int, const char*, const char*, ...) {}

namespace pelorin {

jclass findClassOrThrow(JNIEnv*, const char*) {
  return nullptr;
}

jfieldID getFieldIdOrThrow(JNIEnv*, jclass, const char*, const char*) {
  return nullptr;
}

void throwOutOfMemoryError(JNIEnv*, const char*, ...) {}

}  // namespace pelorin
