#include "bindings/java/photo_errors.h"

#include "platform/pnjni/java_message.h"
#include "platform/pnjni/local_reference.h"

namespace pelorin::quenby {

using jni::LocalReference;

void raisePhotoException(JNIEnv* env, const photo::PhotoError& error) noexcept {
  if (env->ExceptionCheck()) return;
  const bool stopped = error.kind() == photo::PhotoError::Kind::stopped;
  const LocalReference<jclass> type(
      env, env->FindClass(stopped ? "java/util/concurrent/CancellationException"
                                  : "com/pelorin/photos/quenby/autoenhance/PhotoException"));
  if (type.get() == nullptr) return;  // then its own exception is pending, here and below
  const jni::JavaMessage message(error.what());
  if (stopped) {
    env->ThrowNew(type.get(), message.c_str());
    return;
  }
  const jmethodID make = env->GetMethodID(type.get(), "<init>", "(ILjava/lang/String;)V");
  if (make == nullptr) return;
  const LocalReference<jstring> text(env, env->NewStringUTF(message.c_str()));
  if (text.get() == nullptr) return;
  const LocalReference<jobject> exception(
      env, env->NewObject(type.get(), make, static_cast<jint>(error.kind()), text.get()));
  if (exception.get() != nullptr) env->Throw(static_cast<jthrowable>(exception.get()));
}

}  // namespace pelorin::quenby
