#include "platform/pnjni/exceptions.h"

#include <new>
#include <stdexcept>
#include <system_error>
#include <typeinfo>

#include "platform/pn/jni_lookup.h"
#include "platform/pnjni/environment.h"
#include "platform/pnjni/java_message.h"

namespace pelorin::jni {
namespace {

void raise(JNIEnv* env, const char* className, const char* text) {
  const jclass type = env->FindClass(className);
  if (type == nullptr) return;  // then its own exception is pending
  env->ThrowNew(type, JavaMessage(text).c_str());
  env->DeleteLocalRef(type);
}

}  // namespace

void throwCppExceptionIf(bool condition) {
  if (condition) throw JniError("a call into the Java virtual machine failed");
}

void translatePendingCppExceptionToJavaException() noexcept {
  constexpr const char* illegalArgument = "java/lang/IllegalArgumentException";
  JNIEnv* const env = Environment::current();
  if (env->ExceptionCheck()) return;
  try {
    throw;
  } catch (const std::bad_alloc&) {
    raise(env, "java/lang/OutOfMemoryError", "out of native memory");
  } catch (const std::out_of_range& error) {
    raise(env, illegalArgument, error.what());
  } catch (const std::invalid_argument& error) {
    raise(env, illegalArgument, error.what());
  } catch (const std::bad_cast& error) {
    raise(env, illegalArgument, error.what());
  } catch (const std::system_error& error) {
    raise(env, "java/io/IOException", error.what());
  } catch (const std::exception& error) {
    raise(env, "java/lang/RuntimeException", error.what());
  } catch (...) {
    raise(env, "java/lang/RuntimeException", "an unknown native error");
  }
}

}  // namespace pelorin::jni
