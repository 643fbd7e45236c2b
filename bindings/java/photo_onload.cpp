#include <jni.h>

#include "bindings/java/photo_natives.h"
#include "image_processing/core/never_destroyed.h"
#include "platform/pnjni/environment.h"

/// Called by the virtual machine when the library is loaded: registers the natives of PhotoBytes.
/// JNI_ERR, with a Java exception pending, when something they need is missing.
extern "C" JNIEXPORT jint JNICALL JNI_OnLoad(JavaVM* vm, void*) {
  return pelorin::jni::initialize(vm, [] { pelorin::quenby::registerPhotoNatives(); });
}

/// Called when the class loader that loaded the library is gone; the library goes next.
extern "C" JNIEXPORT void JNICALL JNI_OnUnload(JavaVM*, void*) {
  pelorin::image_processing::libraryIsUnloaded = true;
}
