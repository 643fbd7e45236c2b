#pragma once

#include <jni.h>

#include <cstdint>
#include <span>
#include <vector>

namespace pelorin::quenby {

/// The bytes of a file that Java holds in an array, of which this is a copy, or in a direct buffer,
/// which is read in place and must not change meanwhile.
class FileBytes {
 public:
  /// @param array   or null.
  /// @param buffer  a direct java.nio.ByteBuffer, or null; exactly one of the two is there.
  /// @param offset  of the file's first byte, from the beginning of the array or buffer.
  /// @throws std::invalid_argument when it is otherwise, or offset and length lie outside;
  ///         std::bad_alloc.
  FileBytes(JNIEnv* env, jbyteArray array, jobject buffer, jint offset, jint length);

  std::span<const std::uint8_t> bytes() const { return bytes_; }

 private:
  std::vector<std::uint8_t> copy_;
  std::span<const std::uint8_t> bytes_;
};

/// A copy; empty for null. @throws std::bad_alloc.
std::vector<float> floatsOf(JNIEnv* env, jfloatArray array);

// New Java arrays.
// @throws JniError with an OutOfMemoryError pending.
jbyteArray javaArray(JNIEnv* env, std::span<const std::uint8_t> values);
jfloatArray javaArray(JNIEnv* env, std::span<const float> values);
jdoubleArray javaArray(JNIEnv* env, std::span<const double> values);

}  // namespace pelorin::quenby
