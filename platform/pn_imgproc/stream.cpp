#include "platform/pn_imgproc/stream.h"

#include <new>
#include <stdexcept>
#include <string_view>

#include "photo/file_io.h"
#include "platform/pn_imgproc/utf8_path.h"

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

}  // namespace

Stream::Stream(JNIEnv* env, jstring path, const char* mode)
    : path_(pathOf(env, path)), writes_(mode == std::string_view("w")) {
  if (!writes_ && mode != std::string_view("r"))
    throw std::invalid_argument("a stream's mode is \"r\" or \"w\"");
  if (!writes_) bytes = readFile(path_);
}

void Stream::close() {
  if (writes_) writeFileAtomically(path_, bytes);
}

}  // namespace pelorin::imgproc
