#pragma once

#include <jni.h>

namespace pelorin::jni {

/// @throws JniError when `condition` holds, which says that a call into the virtual machine failed.
void throwCppExceptionIf(bool condition);

/// To be called in a catch block: raises the Java exception that stands for the C++ one.
///
/// | C++                   | Java                     | message                   |
/// |-----------------------|--------------------------|---------------------------|
/// | std::bad_alloc        | OutOfMemoryError         | "out of native memory"    |
/// | std::out_of_range     | IllegalArgumentException | `what()`                  |
/// | std::invalid_argument | IllegalArgumentException | `what()`                  |
/// | std::bad_cast         | IllegalArgumentException | `what()`                  |
/// | std::system_error     | java.io.IOException      | `what()`                  |
/// | anything else         | RuntimeException         | `what()`, if it has one   |
///
/// A Java exception that is pending already stays: it is the cause. Allocates no native memory.
void translatePendingCppExceptionToJavaException() noexcept;

template <auto native>
struct ExceptionWrapped;

template <typename Result, typename... Arguments, Result (*native)(JNIEnv*, Arguments...)>
struct ExceptionWrapped<native> {
  static Result JNICALL call(JNIEnv* env, Arguments... arguments) {
    try {
      return native(env, arguments...);
    } catch (...) {
      translatePendingCppExceptionToJavaException();
      return Result();
    }
  }
};

/// What to register for the function `native`: a function that calls it, turns an escaping C++
/// exception into a Java one and then returns the zero of the result's type.
template <auto native>
void* exceptionWrapJNIMethod() {
  return reinterpret_cast<void*>(&ExceptionWrapped<native>::call);
}

}  // namespace pelorin::jni
