#include "jni/rotated_copy.h"

#include <sys/stat.h>

#include "platform/pn_imgproc/utf8_path.h"
#include "platform/pnjni/exceptions.h"

namespace pelorin::quenby {
namespace {

/// Whether what is written to `path` can be read there again.
bool keepsContent(const char* path) {
  struct stat status = {};
  return stat(imgproc::utf8Path(path).c_str(), &status) != 0 || S_ISREG(status.st_mode);
}

}  // namespace

RotatedCopy::RotatedCopy(JNIEnv* env, jstring outputPath, const char* characters)
    : outputPath_(outputPath), characters_(characters) {
  if (keepsContent(characters)) return;
  memory_.emplace(env);
  jni::throwCppExceptionIf(memory_->path.get() == nullptr);
}

}  // namespace pelorin::quenby
