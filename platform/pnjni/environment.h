#pragma once

#include <jni.h>

namespace pelorin::jni {

/// Sets this library up for `vm` and runs `onLoad`, in which `Environment::current` works.
/// @returns the JNI version to report to the virtual machine, or JNI_ERR when `onLoad` threw; a
///          Java exception is then pending, which the virtual machine throws from `System.load`.
jint initialize(JavaVM* vm, void (*onLoad)());

/// The Java environment of the thread that asks.
class Environment {
 public:
  /// @throws JniError when the thread is not attached to the virtual machine, or there is none.
  static JNIEnv* current();
};

}  // namespace pelorin::jni
