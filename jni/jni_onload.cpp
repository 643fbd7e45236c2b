#include <jni.h>

#include "image_processing/core/never_destroyed.h"
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

/// Called when the class loader that loaded the library is gone. The library goes next, with the
/// sessions that nobody released.
extern "C" JNIEXPORT void JNICALL JNI_OnUnload(JavaVM* vm, void*) {
  pelorin::image_processing::libraryIsUnloaded = true;
  void* env = nullptr;
  if (vm->GetEnv(&env, JNI_VERSION_1_6) == JNI_OK)
    pelorin::quenby::forgetJava(static_cast<JNIEnv*>(env));
}
