#pragma once

#include <jni.h>

#include <stdexcept>

namespace pelorin {

/// A call into the virtual machine failed. As a rule a Java exception is pending and is what the
/// Java caller will see.
class JniError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

/// A class by its path, "java/lang/String", as a local reference of the caller's.
/// @throws JniError, with the virtual machine's exception pending, when there is none.
jclass findClassOrThrow(JNIEnv* env, const char* name);

/// A field of `owner` by name and signature.
/// @throws JniError, with the virtual machine's exception pending, when there is none.
jfieldID getFieldIdOrThrow(JNIEnv* env, jclass owner, const char* name, const char* signature);

/// Raises a java.lang.OutOfMemoryError with the formatted message, at most 255 bytes. Allocates no
/// native memory. Does nothing when an exception is pending: the first cause is the one to see.
void throwOutOfMemoryError(JNIEnv* env, const char* format, ...)
    __attribute__((format(printf, 2, 3)));

}  // namespace pelorin
