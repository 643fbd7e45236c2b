#include <jni.h>

#include "jni/registration.h"
#include "platform/pnjni/environment.h"

/// Called by the virtual machine when the library is loaded: registers all natives. JNI_ERR, with a
/// Java exception pending, when something they need is missing.
extern "C" JNIEXPORT jint JNICALL JNI_OnLoad(JavaVM* vm, void*) {
  return pelorin::jni::initialize(vm, [] {
    pelorin::quenby::registerQuenbyFilterNatives();
    pelorin::quenby::registerImageDupeDetectorNatives();
  });
}
