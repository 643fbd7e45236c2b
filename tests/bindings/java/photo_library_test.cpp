#include <gtest/gtest.h>
#include <jni.h>

#include "photo/photo.h"
#include "tests/jni/support/fake_environment.h"
#include "tests/support/bytes.h"
#include "tests/support/fingerprint.h"
#include "tests/support/pictures.h"

extern "C" jint JNI_OnLoad(JavaVM* machine, void*);

namespace pelorin::test_support {
namespace {

// libquenby_photo.so itself, with what is linked into it.
class PhotoLibrary : public testing::Test {
 protected:
  PhotoLibrary() { EXPECT_EQ(JNI_OnLoad(FakeEnvironment::machine(), nullptr), JNI_VERSION_1_6); }
  ~PhotoLibrary() override {
    EXPECT_EQ(env.takeException(), "");
    EXPECT_EQ(env.violations(), "");
  }

  std::string enhanced(const Bytes& file) {
    using Filter = jbyteArray (*)(JNIEnv*, jobject, jbyteArray, jobject, jint, jint, jint, jint,
                                  jint, jfloatArray, jint, jstring, jstring, jboolean, jlong,
                                  jobjectArray, jlong, jlong, jint, jint, jboolean);
    const auto filter = reinterpret_cast<Filter>(FakeEnvironment::registered().at(
        "filter([BLjava/nio/ByteBuffer;IIIII[FILjava/lang/String;Ljava/lang/String;ZJ[[BJJIIZ)[B"));
    FakeObject array{.bytes = file}, name{.text = "AE0"}, params{.text = "slider=0.4;"};
    const jbyteArray made = filter(
        &env, nullptr, reinterpret_cast<jbyteArray>(&array), nullptr, 0,
        static_cast<jint>(file.size()), 90, 0, 0, nullptr, 1, reinterpret_cast<jstring>(&name),
        reinterpret_cast<jstring>(&params), JNI_FALSE, 0, nullptr, 0, 0, 0, 0, JNI_FALSE);
    if (made == nullptr) return "nothing";
    const Bytes bytes = env.resolve(made, "test")->bytes;
    env.DeleteLocalRef(made);
    return fingerprint(bytes.data(), bytes.size());
  }

  FakeEnvironment env;
  const Image<RGBA8Pixel> picture = photoLikePicture(130, 100, 3);
};

TEST_F(PhotoLibrary, MakesTheSameFileOfAJpegFileOnEveryMachine) {
  EXPECT_EQ(enhanced(photo::save(picture, "JPEG", {})), "672b95f180de5747");
}

TEST_F(PhotoLibrary, MakesTheSameFileOfAPngFileOnEveryMachine) {
  EXPECT_EQ(enhanced(photo::save(picture, "PNG", {})), "54619ae0cd690465");
}

}  // namespace
}  // namespace pelorin::test_support
