#pragma once

#include <gtest/gtest.h>

#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "bindings/java/photo_natives.h"
#include "image_processing/dupe/cdf_distance.h"
#include "platform/pnjni/environment.h"
#include "tests/jni/support/natives_fixture.h"
#include "tests/support/exif_payload.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {

struct FakeBytes : FakeObject {
  explicit FakeBytes(const Bytes& content) { bytes = content; }
  operator jbyteArray() { return reinterpret_cast<jbyteArray>(static_cast<FakeObject*>(this)); }
};

struct FakeBuffer : FakeObject {
  explicit FakeBuffer(Bytes& content) {
    address = content.data();
    capacity = content.size();
  }
  operator jobject() { return reinterpret_cast<jobject>(static_cast<FakeObject*>(this)); }
};

struct FakeFloats : FakeObject {
  explicit FakeFloats(std::vector<float> values) { floatElements = std::move(values); }
  explicit FakeFloats(const image_processing::GreenCDF& cdf) {
    floatElements.assign(cdf.begin(), cdf.end());
  }
  operator jfloatArray() { return reinterpret_cast<jfloatArray>(static_cast<FakeObject*>(this)); }
};

/// An array of one array of bytes.
struct FakeSlot : FakeObject {
  FakeSlot() {
    content.bytes.reserve(1024);
    elements = {&content};
  }
  FakeObject content;
  operator jobjectArray() { return reinterpret_cast<jobjectArray>(static_cast<FakeObject*>(this)); }
};

/// Limits, 0 for what the natives have.
struct MaxOf {
  jlong bytes = 0, pixels = 0;
  jint scans = 0, segments = 0;
};

/// The natives as Java calls them, in one environment.
struct PhotoCalls {
  FakeEnvironment& env;

  template <typename Result, typename... Arguments>
  Result call(const char* nameAndSignature, Arguments... arguments) const {
    const auto function = reinterpret_cast<Result (*)(JNIEnv*, jobject, Arguments...)>(
        FakeEnvironment::registered().find(std::string_view(nameAndSignature))->second);
    return function(&env, nullptr, arguments...);
  }

  /// What the array that a native returned holds; its reference is given back.
  const FakeObject* taken(jobject array) const {
    if (array == nullptr) return nullptr;
    const FakeObject* const object = env.resolve(array, "test");
    env.DeleteLocalRef(array);
    return object;
  }

  Bytes filter(jbyteArray array, jobject buffer, jint offset, jint length, jint quality,
               jint rotation, jfloatArray faces, jint scale, jstring name, jstring params,
               jlong cancel, jint subsampling = 0, jboolean mark = JNI_TRUE,
               jobjectArray lost = nullptr, const MaxOf& most = {}) const {
    const FakeObject* const made = taken(call<jbyteArray>(
        "filter([BLjava/nio/ByteBuffer;IIIII[FILjava/lang/String;Ljava/lang/String;ZJ[[BJJIIZ)[B",
        array, buffer, offset, length, quality, subsampling, rotation, faces, scale, name, params,
        mark, cancel, lost, most.bytes, most.pixels, most.scans, most.segments,
        jboolean{JNI_FALSE}));
    return made == nullptr ? Bytes() : made->bytes;
  }

  std::vector<float> floats(const char* name, FakeBytes& file, jlong cancel = 0,
                            const MaxOf& most = {}) const {
    const FakeObject* const made =
        taken(call<jfloatArray>((std::string(name) + "([BLjava/nio/ByteBuffer;IIJJJII)[F").c_str(),
                                static_cast<jbyteArray>(file), static_cast<jobject>(nullptr),
                                jint{0}, static_cast<jint>(file.bytes.size()), cancel, most.bytes,
                                most.pixels, most.scans, most.segments));
    return made == nullptr ? std::vector<float>() : made->floatElements;
  }

  float niqe(FakeBytes& file, jlong cancel = 0, const MaxOf& most = {}) const {
    return call<jfloat>("niqe([BLjava/nio/ByteBuffer;IIJJJII)F", static_cast<jbyteArray>(file),
                        static_cast<jobject>(nullptr), jint{0},
                        static_cast<jint>(file.bytes.size()), cancel, most.bytes, most.pixels,
                        most.scans, most.segments);
  }

  std::vector<double> facts(FakeBytes& file, const MaxOf& most = {}) const {
    const FakeObject* const made = taken(call<jdoubleArray>(
        "facts([BLjava/nio/ByteBuffer;IIJJII)[D", static_cast<jbyteArray>(file),
        static_cast<jobject>(nullptr), jint{0}, static_cast<jint>(file.bytes.size()), most.bytes,
        most.pixels, most.scans, most.segments));
    return made == nullptr ? std::vector<double>() : made->doubleElements;
  }

  jlong newCancel() const { return call<jlong>("newCancel()J"); }
  void cancel(jlong handle) const { call<void>("cancel(J)V", handle); }
  void freeCancel(jlong handle) const { call<void>("freeCancel(J)V", handle); }
};

/// The natives of PhotoBytes registered in the fake environment, with a photo to call them with.
class PhotoNatives : public testing::Test {
 protected:
  PhotoNatives() {
    jint loaded = jni::initialize(FakeEnvironment::machine(), quenby::registerPhotoNatives);
    EXPECT_EQ(loaded, JNI_VERSION_1_6);
  }
  ~PhotoNatives() override {
    EXPECT_EQ(env.takeException(), "") << "an exception the test did not look at";
    EXPECT_EQ(env.violations(), "");
  }

  /// On its side, with a comment and a time in the zone two hours east.
  static Bytes turnedPhoto(std::uint32_t width = 130, std::uint32_t height = 100) {
    const ExifFields fields{
        .orientation = 6, .dateTime = "2024:05:01 12:30:45", .subSeconds = "5", .offset = "+02:00"};
    return jpegOf(photoLikePicture(width, height, 3),
                  {{0xE1, exifPayload(fields, true)}, {0xFE, {'h', 'i'}}});
  }

  Bytes filtered(FakeBytes& from, jlong cancel = 0) {
    return calls.filter(from, nullptr, 0, static_cast<jint>(from.bytes.size()), 90, 0, nullptr, 1,
                        ae, slider, cancel);
  }

  FakeEnvironment env;
  PhotoCalls calls{env};
  FakeBytes file{turnedPhoto()};
  FakeString ae{"AE0"}, slider{"slider=0.4;"};
};

}  // namespace pelorin::test_support
