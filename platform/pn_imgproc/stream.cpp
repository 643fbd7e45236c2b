#include "platform/pn_imgproc/stream.h"

#include <new>
#include <stdexcept>
#include <string_view>

#include "platform/pn_imgproc/stream_file.h"
#include "platform/pn_imgproc/utf8_path.h"
#include "platform/pnjni/exceptions.h"

namespace pelorin::imgproc {
namespace {

std::string pathOf(JNIEnv* env, jstring path) {
  if (path == nullptr) throw std::invalid_argument("the path is null");
  struct Release {
    JNIEnv* env;
    jstring path;
    const char* characters;
    ~Release() {
      if (characters != nullptr) env->ReleaseStringUTFChars(path, characters);
    }
  } const held{env, path, env->GetStringUTFChars(path, nullptr)};
  if (held.characters == nullptr) throw std::bad_alloc();
  return utf8Path(held.characters);
}

StreamFile::Mode modeOf(std::string_view mode) {
  if (mode == "r") return StreamFile::Mode::read;
  if (mode == "w") return StreamFile::Mode::write;
  throw std::invalid_argument("a stream's mode is \"r\" or \"w\"");
}

}  // namespace

Stream::Stream(JNIEnv* env, jstring path, const char* mode)
    : file_(std::make_unique<StreamFile>(pathOf(env, path), modeOf(mode))) {}

Stream::~Stream() {
  try {
    file_->close();
  } catch (...) {
    jni::translatePendingCppExceptionToJavaException();
  }
}

}  // namespace pelorin::imgproc
