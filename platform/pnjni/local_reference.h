#pragma once

#include <jni.h>

#include <utility>

namespace pelorin::jni {

/// A local reference that is deleted with its scope.
template <typename T>
class LocalReference {
 public:
  LocalReference(JNIEnv* env, T object) : env_(env), object_(object) {}
  LocalReference(LocalReference&& other) noexcept
      : env_(other.env_), object_(std::exchange(other.object_, nullptr)) {}
  LocalReference& operator=(LocalReference&&) = delete;
  ~LocalReference() {
    if (object_ != nullptr) env_->DeleteLocalRef(object_);
  }

  T get() const { return object_; }

 private:
  JNIEnv* env_;
  T object_;
};

/// A class by its path, with the current environment.
/// @throws JniError, with the virtual machine's exception pending, when there is none.
LocalReference<jclass> findClassLocal(const char* name);

}  // namespace pelorin::jni
