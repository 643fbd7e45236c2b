#pragma once

#include <jni.h>

#include <string>

namespace pelorin::quenby {

/// The modified UTF-8 characters of a Java string, released with their scope.
class JavaCharacters {
 public:
  /// @param text  not null.
  /// @throws std::bad_alloc when the virtual machine cannot supply them; its own exception is then
  ///         pending as a rule.
  JavaCharacters(JNIEnv* env, jstring text);
  ~JavaCharacters() { env_->ReleaseStringUTFChars(text_, characters_); }
  JavaCharacters(const JavaCharacters&) = delete;
  JavaCharacters& operator=(const JavaCharacters&) = delete;

  const char* get() const { return characters_; }

 private:
  JNIEnv* env_;
  jstring text_;
  const char* characters_;
};

/// A copy of the characters; empty for null. @throws std::bad_alloc as `JavaCharacters`.
std::string toString(JNIEnv* env, jstring text);

}  // namespace pelorin::quenby
