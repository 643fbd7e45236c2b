#pragma once

#include <jni.h>

#include <optional>

#include "jni/memory_file.h"
#include "platform/pnjni/local_reference.h"

namespace pelorin::quenby {

/// Where the rotated copy of a JPEG file is until it is decoded: at the output, or in memory when the
/// output is a pipe, a device or else no regular file, from which it could not be read again.
class RotatedCopy {
 public:
  /// @param outputPath  which must outlive this.
  /// @param characters  the same in modified UTF-8, likewise.
  /// @throws std::system_error when there is no memory file, std::bad_alloc, and JniError with the
  ///         Java exception pending.
  RotatedCopy(JNIEnv* env, jstring outputPath, const char* characters);

  jstring javaPath() const { return memory_ ? memory_->path.get() : outputPath_; }
  const char* path() const { return memory_ ? memory_->file.path() : characters_; }

 private:
  struct Memory {
    explicit Memory(JNIEnv* env) : path(env, env->NewStringUTF(file.path())) {}

    MemoryFile file;
    jni::LocalReference<jstring> path;
  };

  jstring outputPath_;
  const char* characters_;
  std::optional<Memory> memory_;
};

}  // namespace pelorin::quenby
