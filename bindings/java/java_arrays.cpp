#include "bindings/java/java_arrays.h"

#include <limits>
#include <new>
#include <stdexcept>

#include "platform/pnjni/exceptions.h"

namespace pelorin::quenby {

using jni::throwCppExceptionIf;

namespace {

jsize sizeOf(std::size_t count) {
  if (count > static_cast<std::size_t>(std::numeric_limits<jsize>::max())) throw std::bad_alloc();
  return static_cast<jsize>(count);
}

void requireInside(jint offset, jint length, jlong size) {
  if (offset < 0 || length < 0 || jlong{offset} + length > size)
    throw std::invalid_argument("offset and length lie outside the bytes");
}

}  // namespace

FileBytes::FileBytes(JNIEnv* env, jbyteArray array, jobject buffer, jint offset, jint length) {
  if ((array == nullptr) == (buffer == nullptr))
    throw std::invalid_argument("either an array or a buffer holds the bytes");
  if (array != nullptr) {
    requireInside(offset, length, env->GetArrayLength(array));
    copy_.resize(static_cast<std::size_t>(length));
    env->GetByteArrayRegion(array, offset, length, reinterpret_cast<jbyte*>(copy_.data()));
    bytes_ = copy_;
    return;
  }
  const auto* const address = static_cast<const std::uint8_t*>(env->GetDirectBufferAddress(buffer));
  if (address == nullptr) throw std::invalid_argument("the buffer is not direct");
  requireInside(offset, length, env->GetDirectBufferCapacity(buffer));
  bytes_ = {address + offset, static_cast<std::size_t>(length)};
}

std::vector<float> floatsOf(JNIEnv* env, jfloatArray array) {
  if (array == nullptr) return {};
  std::vector<float> values(static_cast<std::size_t>(env->GetArrayLength(array)));
  env->GetFloatArrayRegion(array, 0, sizeOf(values.size()), values.data());
  return values;
}

jbyteArray javaArray(JNIEnv* env, std::span<const std::uint8_t> values) {
  const jbyteArray array = env->NewByteArray(sizeOf(values.size()));
  throwCppExceptionIf(array == nullptr);
  env->SetByteArrayRegion(array, 0, sizeOf(values.size()),
                          reinterpret_cast<const jbyte*>(values.data()));
  return array;
}

jfloatArray javaArray(JNIEnv* env, std::span<const float> values) {
  const jfloatArray array = env->NewFloatArray(sizeOf(values.size()));
  throwCppExceptionIf(array == nullptr);
  env->SetFloatArrayRegion(array, 0, sizeOf(values.size()), values.data());
  return array;
}

jdoubleArray javaArray(JNIEnv* env, std::span<const double> values) {
  const jdoubleArray array = env->NewDoubleArray(sizeOf(values.size()));
  throwCppExceptionIf(array == nullptr);
  env->SetDoubleArrayRegion(array, 0, sizeOf(values.size()), values.data());
  return array;
}

}  // namespace pelorin::quenby
