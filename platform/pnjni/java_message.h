#pragma once

namespace pelorin::jni {

/// A text as the virtual machine takes it (modified UTF-8), in a buffer of its own: what does not
/// belong there, characters beyond the basic plane included, becomes "?", and it is cut after 1000
/// bytes. Messages of the C library may be in any encoding, and a virtual machine may end the
/// process for a malformed one.
class JavaMessage {
 public:
  explicit JavaMessage(const char* text) noexcept;
  const char* c_str() const { return buffer_; }

 private:
  char buffer_[1004];
};

}  // namespace pelorin::jni
