#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <stdexcept>
#include <string>
#include <vector>

#include "platform/pn_imgproc/native_image_processor.h"
#include "tests/jni/support/natives_fixture.h"

// A device's own codec library, which tells what the natives ask it for and may notice a failure
// only while it closes.

namespace pelorin::imgproc {

namespace {

std::vector<std::string> calls;
std::string failsToClose;  ///< Path of the stream that raises an exception then.

}  // namespace

class StreamFile {
 public:
  JNIEnv* env;
  std::string path;
};

Stream::Stream(JNIEnv* env, jstring path, const char* mode) {
  const char* const characters = env->GetStringUTFChars(path, nullptr);
  file_.reset(new StreamFile{env, characters});
  env->ReleaseStringUTFChars(path, characters);
  calls.push_back("open " + file_->path + " " + mode);
  if (file_->path == "missing" && *mode == 'r') throw std::runtime_error("no such file");
}

Stream::~Stream() {
  calls.push_back("close " + file_->path);
  if (failsToClose == file_->path)
    file_->env->ThrowNew(file_->env->FindClass("java/io/IOException"), "no space left");
}

void NativeImageProcessor::rotateJpeg(JNIEnv*, Stream& in, Stream& out, int rotation) {
  calls.push_back("rotate " + in.file_->path + " " + out.file_->path + " " +
                  std::to_string(rotation));
}

void NativeImageProcessor::decodeJpeg(JNIEnv* env, const char* path, std::uint8_t** pixels,
                                      int* width, int* height, ColorSpace, int scale) {
  if (env->ExceptionCheck()) std::abort();
  calls.push_back(std::string("decode ") + path + " " + std::to_string(scale));
  *width = *height = 1;
  *pixels = static_cast<std::uint8_t*>(std::calloc(4, 1));
}

void NativeImageProcessor::encodeJpeg(JNIEnv*, const std::uint8_t*, int width, int height,
                                      ColorSpace, int quality, Stream& out) {
  calls.push_back("encode " + std::to_string(width) + "x" + std::to_string(height) + " " +
                  std::to_string(quality) + " " + out.file_->path);
}

}  // namespace pelorin::imgproc

namespace pelorin::test_support {
namespace {

using imgproc::calls;
using imgproc::failsToClose;
using testing::ElementsAre;

class DeviceCodec : public NativesTest {
 protected:
  DeviceCodec() {
    calls.clear();
    failsToClose.clear();
  }
  ~DeviceCodec() override {
    env.localReferences = 0;  // the codec's own
  }

  bool turn(FakeString& from) {
    return natives.applyToFile(from, output, 90, nullptr, 2, filter, nullptr);
  }

  FakeString input{"in"}, output{"out"}, missing{"missing"}, filter{"PassThrough"};
};

TEST_F(DeviceCodec, IsAskedInTurnAndClosesEachStreamBeforeTheNextStep) {
  EXPECT_TRUE(turn(input));
  EXPECT_THAT(calls,
              ElementsAre("open in r", "open out w", "rotate in out 90", "close out", "close in",
                          "decode out 2", "open out w", "encode 1x1 90 out", "close out"));
}

TEST_F(DeviceCodec, IsNotAskedForTheOutputBeforeTheInputIsOpen) {
  EXPECT_FALSE(turn(missing));
  EXPECT_EQ(env.takeException(), "java/lang/RuntimeException: no such file");
  EXPECT_THAT(calls, ElementsAre("open missing r"));
}

TEST_F(DeviceCodec, StopsTheNativeByAFailureToCloseTheCopy) {
  failsToClose = "out";
  EXPECT_FALSE(turn(input));
  EXPECT_EQ(env.takeException(), "java/io/IOException: no space left");
  EXPECT_THAT(calls,
              ElementsAre("open in r", "open out w", "rotate in out 90", "close out", "close in"));
}

TEST_F(DeviceCodec, MakesTheResultFalseByAFailureToCloseTheOutput) {
  failsToClose = "out";
  EXPECT_FALSE(natives.applyToFile(input, output, 0, nullptr, 1, filter, nullptr));
  EXPECT_EQ(env.takeException(), "java/io/IOException: no space left");
  EXPECT_EQ(calls.back(), "close out");
}

}  // namespace
}  // namespace pelorin::test_support
