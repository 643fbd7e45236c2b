#pragma once

#include <jni.h>

#include "photo/photo_error.h"
#include "platform/pnjni/exceptions.h"

namespace pelorin::quenby {

/// Raises a PhotoException with the error's kind, as its place in `PhotoError::Kind`, and its text;
/// for `Stopped` a java.util.concurrent.CancellationException.
void raisePhotoException(JNIEnv* env, const photo::PhotoError& error) noexcept;

template <auto native>
struct PhotoErrorsRaised;

template <typename Result, typename... Arguments, Result (*native)(JNIEnv*, Arguments...)>
struct PhotoErrorsRaised<native> {
  static Result call(JNIEnv* env, Arguments... arguments) {
    try {
      return native(env, arguments...);
    } catch (const photo::PhotoError& error) {
      raisePhotoException(env, error);
      return Result();
    }
  }
};

/// What to register for a native that works on photos: as `exceptionWrapJNIMethod`, with the errors
/// of photos as well.
template <auto native>
void* photoNative() {
  return jni::exceptionWrapJNIMethod<&PhotoErrorsRaised<native>::call>();
}

}  // namespace pelorin::quenby
