#pragma once

#include <jni.h>

#include <cstdint>
#include <string>
#include <vector>

namespace pelorin::imgproc {

/// A file of a Java path, whole in memory. For one thread.
class Stream {
 public:
  /// @param mode  "r" reads the file; "w" touches nothing before `close`.
  /// @throws std::invalid_argument for a null path or another mode, std::system_error when the file
  ///         cannot be read.
  Stream(JNIEnv* env, jstring path, const char* mode);
  Stream(const Stream&) = delete;
  Stream& operator=(const Stream&) = delete;

  /// Puts what was written in place of the file, in one step. A stream that is destroyed without
  /// it, as when an exception passes, leaves the file as it was. Nothing to do for mode "r".
  /// @throws std::system_error when the file cannot be written.
  void close();

  std::vector<std::uint8_t> bytes;  ///< The file's content.

 private:
  std::string path_;
  bool writes_;
};

}  // namespace pelorin::imgproc
