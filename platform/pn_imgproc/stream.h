#pragma once

#include <jni.h>

#include <memory>

namespace pelorin::imgproc {

class StreamFile;

/// A file of a Java path, for one thread. It is closed when it is destroyed: what a codec wrote into
/// it then takes the place of the file, in one step. When nothing was written to the end, as when an
/// exception passes, the file stays as it was.
class Stream {
 public:
  /// @param mode  "r" reads the file; "w" touches nothing yet.
  /// @throws std::invalid_argument for a null path or another mode, std::system_error when the file
  ///         cannot be read, std::bad_alloc.
  Stream(JNIEnv* env, jstring path, const char* mode);
  /// A failure to close leaves a java.io.IOException pending, unless there is one already.
  ~Stream();
  Stream(const Stream&) = delete;
  Stream& operator=(const Stream&) = delete;

 private:
  friend class NativeImageProcessor;
  std::unique_ptr<StreamFile> file_;
};

}  // namespace pelorin::imgproc
