#include "bindings/java/photo_natives.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <chrono>
#include <cmath>
#include <functional>
#include <thread>

#include "bindings/java/cancellations.h"
#include "image_processing/dupe/cdf_distance.h"
#include "image_processing/dupe/dupe_score.h"
#include "image_processing/quality/niqe.h"
#include "photo/collection/photo_record.h"
#include "photo/photo.h"
#include "tests/bindings/java/photo_natives_fixture.h"
#include "tests/support/allocation_faults.h"
#include "tests/support/jpeg_files.h"

namespace pelorin::test_support {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::StartsWith;

TEST_F(PhotoNatives, KeepTheMetadataAndShowThePhotoUpright) {
  const photo::PhotoFacts before = photo::readFacts(file.bytes);
  const photo::PhotoFacts after = photo::readFacts(filtered(file));
  EXPECT_EQ(before.orientation, 6);
  EXPECT_EQ(after.orientation, 1);
  EXPECT_EQ(after.width, before.height);
  ASSERT_TRUE(after.captureTime);
  EXPECT_EQ(after.captureTime->text, before.captureTime->text);
}

TEST_F(PhotoNatives, ScoreThePictureAsTheCommandDoes) {
  const auto upright = photo::open(file.bytes).image;
  EXPECT_EQ(calls.niqe(file), image_processing::niqeMetric(*upright));
  EXPECT_EQ(calls.floats("niqeFeatures", file),
            image_processing::analyzeNiqe(*upright).meanFeatures);
  EXPECT_EQ(calls.floats("niqeFeatures", file).size(), 36u);
  FakeBytes small(smallJpeg());
  EXPECT_TRUE(std::isnan(calls.niqe(small)));
  EXPECT_TRUE(calls.floats("niqeFeatures", small).empty());
}

TEST_F(PhotoNatives, CompareTwoPhotosFromTheirDistributions) {
  FakeBytes other(jpegOf(photoLikePicture(160, 120, 9)));
  FakeFloats a(calls.floats("greenCdf", file)), b(calls.floats("greenCdf", other));
  const auto cdfA = photo::readPhotoRecord(file.bytes).cdf.unpacked();
  const auto cdfB = photo::readPhotoRecord(other.bytes).cdf.unpacked();
  EXPECT_EQ(a.floatElements, FakeFloats(cdfA).floatElements);
  const float distance = calls.call<jfloat>("distance([F[F)F", static_cast<jfloatArray>(a),
                                            static_cast<jfloatArray>(b));
  EXPECT_EQ(distance, image_processing::exposureInvariantCDFDistance(cdfA, cdfB));
  for (const bool same : {false, true}) {
    const jboolean flag = same ? JNI_TRUE : JNI_FALSE;
    EXPECT_EQ(calls.call<jfloat>("score(FDZ)F", distance, jdouble{-3.5}, flag),
              image_processing::dupeScoreOfCDFs(cdfA, cdfB, 3.5f, same));
    EXPECT_EQ(calls.call<jdouble>("window(FZ)D", jfloat{0.0f}, flag),
              image_processing::longestDupeTimeDifference(0.0f, same));
  }
}

TEST_F(PhotoNatives, TellWhatAHeaderSays) {
  const double utc = 1714559445.5;  // 2024-05-01T10:30:45.5Z
  EXPECT_THAT(calls.facts(file), ElementsAre(130, 100, 6, utc + 7200, utc));
  FakeBytes plain(smallJpeg());
  const std::vector<double> facts = calls.facts(plain);
  ASSERT_EQ(facts.size(), 5u);
  EXPECT_EQ(facts[2], 1);
  EXPECT_TRUE(std::isnan(facts[3]) && std::isnan(facts[4]));
}

TEST_F(PhotoNatives, TellEachKindOfBadFileApart) {
  const std::string type = "com/pelorin/photos/quenby/autoenhance/PhotoException: ";
  Bytes cut = file.bytes;
  cut.resize(cut.size() / 2);
  const std::vector<std::pair<Bytes, std::string>> files = {
      {{}, "0 "},
      {{'t', 'e', 'x', 't'}, "1 "},
      {cut, "4 "},
      {withSize(file.bytes, 65500, 65500), "5 "}};
  for (const auto& [content, kind] : files) {
    FakeBytes bad(content);
    EXPECT_TRUE(filtered(bad).empty());
    EXPECT_THAT(env.takeException(), StartsWith(type + kind));
    calls.niqe(bad);
    EXPECT_THAT(env.takeException(), StartsWith(type + kind));
    calls.floats("niqeFeatures", bad);
    EXPECT_THAT(env.takeException(), StartsWith(type + kind));
    calls.floats("greenCdf", bad);
    EXPECT_THAT(env.takeException(), StartsWith(type + kind));
  }
}

TEST_F(PhotoNatives, NameTheArgumentThatIsWrong) {
  const jint size = static_cast<jint>(file.bytes.size());
  const auto refused = [&](const std::string& name, const std::string& params, jint quality,
                           jint rotation, jint scale, std::vector<float> sides) {
    FakeString filter(name), parameters(params);
    FakeFloats faces(std::move(sides));
    EXPECT_TRUE(
        calls.filter(file, nullptr, 0, size, quality, rotation, faces, scale, filter, parameters, 0)
            .empty());
    const std::string exception = env.takeException();
    EXPECT_THAT(exception, StartsWith("java/lang/IllegalArgumentException: "));
    return exception;
  };
  EXPECT_THAT(refused("AE9", "", 90, 0, 1, {}), HasSubstr("filter: there is no 'AE9'"));
  EXPECT_THAT(refused("AE0", "", 90, 0, 1, {}), HasSubstr("slider"));
  EXPECT_THAT(refused("AE0", "slide=0.4;", 90, 0, 1, {}), HasSubstr("slide"));
  EXPECT_THAT(refused("AE0", "slider=much;", 90, 0, 1, {}), HasSubstr("slider"));
  EXPECT_THAT(refused("AE0", "slider=0.4;", 0, 0, 1, {}), HasSubstr("quality"));
  EXPECT_THAT(refused("AE0", "slider=0.4;", 101, 0, 1, {}), HasSubstr("quality"));
  EXPECT_THAT(refused("AE0", "slider=0.4;", 90, 45, 1, {}), HasSubstr("rotation"));
  EXPECT_THAT(refused("AE0", "slider=0.4;", 90, 0, 3, {}), HasSubstr("scale"));
  EXPECT_THAT(refused("AE0", "slider=0.4;", 90, 0, 1, {1, 2, 3}), HasSubstr("faces"));
  EXPECT_THAT(refused("AE0", "slider=0.4;", 90, 0, 1, {0, 0, NAN, 1}), HasSubstr("faces"));
  for (const auto& [offset, length] :
       {std::pair{-1, size}, {0, size + 1}, {1, size}, {0, -1}, {2147483647, 2147483647}}) {
    calls.filter(file, nullptr, offset, length, 90, 0, nullptr, 1, ae, slider, 0);
    EXPECT_THAT(env.takeException(), HasSubstr("offset and length"));
  }
  FakeBuffer buffer(file.bytes), notDirect(file.bytes);
  notDirect.address = nullptr;
  calls.filter(file, buffer, 0, size, 90, 0, nullptr, 1, ae, slider, 0);
  EXPECT_THAT(env.takeException(), HasSubstr("either an array or a buffer"));
  calls.filter(nullptr, nullptr, 0, size, 90, 0, nullptr, 1, ae, slider, 0);
  EXPECT_THAT(env.takeException(), HasSubstr("either an array or a buffer"));
  calls.filter(nullptr, notDirect, 0, size, 90, 0, nullptr, 1, ae, slider, 0);
  EXPECT_THAT(env.takeException(), HasSubstr("not direct"));
  calls.filter(file, nullptr, 0, size, 90, 0, nullptr, 1, nullptr, nullptr, 0);
  EXPECT_THAT(env.takeException(), HasSubstr("filter"));
  FakeFloats few(std::vector<float>{1, 2}), cdf(image_processing::GreenCDF{});
  calls.call<jfloat>("distance([F[F)F", static_cast<jfloatArray>(cdf),
                     static_cast<jfloatArray>(few));
  EXPECT_THAT(env.takeException(), HasSubstr("256"));
  calls.call<jfloat>("distance([F[F)F", static_cast<jfloatArray>(nullptr),
                     static_cast<jfloatArray>(cdf));
  EXPECT_THAT(env.takeException(), HasSubstr("256"));
}

TEST_F(PhotoNatives, RefuseWhatAsksForMoreThanTheLimits) {
  const photo::JpegHeader header = photo::readJpegHeader(file.bytes);
  const jlong pixels = jlong{header.width} * header.height;
  const auto errorOf = [&](const MaxOf& most) {
    calls.niqe(file, 0, most);
    const std::string error = env.takeException();
    for (const char* const native : {"niqeFeatures", "greenCdf"}) {
      calls.floats(native, file, 0, most);
      EXPECT_EQ(env.takeException(), error) << native;
    }
    FakeString name{"AE0"}, params{"slider=0.4;"};
    calls.filter(file, nullptr, 0, static_cast<jint>(file.bytes.size()), 90, 0, nullptr, 1, name,
                 params, 0, 0, JNI_TRUE, nullptr, most);
    EXPECT_EQ(env.takeException(), error);
    calls.facts(file, most);
    EXPECT_EQ(env.takeException(), error) << "facts";
    return error;
  };
  EXPECT_EQ(errorOf({.pixels = pixels}), "");
  EXPECT_THAT(errorOf({.pixels = pixels - 1}), HasSubstr("too large: "));
  EXPECT_THAT(errorOf({.segments = 1}), HasSubstr("too many segments: at most 1"));
  const auto bytes = static_cast<jlong>(file.bytes.size());
  EXPECT_EQ(errorOf({.bytes = bytes}), "");
  EXPECT_THAT(errorOf({.bytes = bytes - 1}), HasSubstr("is larger than "));
  file.bytes = test_support::makeJpeg({.scans = test_support::progressiveScans(10)});
  EXPECT_EQ(errorOf({.scans = 10}), "");
  EXPECT_THAT(errorOf({.scans = 9}), HasSubstr("too many scans: at most 9"));
  for (const MaxOf& negative :
       {MaxOf{.bytes = -1}, MaxOf{.pixels = -1}, MaxOf{.scans = -1}, MaxOf{.segments = -1}})
    EXPECT_EQ(errorOf(negative), "java/lang/IllegalArgumentException: limits: are negative");
}

TEST_F(PhotoNatives, EndACallThatIsCancelled) {
  const std::string cancelled = "java/util/concurrent/CancellationException: interrupted";
  const jlong handle = calls.newCancel(), other = calls.newCancel();
  EXPECT_GT(handle, 0);
  EXPECT_GT(other, handle);
  calls.cancel(other);
  EXPECT_FALSE(filtered(file, handle).empty());
  calls.cancel(handle);
  EXPECT_TRUE(filtered(file, handle).empty());
  EXPECT_EQ(env.takeException(), cancelled);
  calls.niqe(file, handle);
  EXPECT_EQ(env.takeException(), cancelled);
  calls.floats("niqeFeatures", file, handle);
  EXPECT_EQ(env.takeException(), cancelled);
  calls.floats("greenCdf", file, handle);
  EXPECT_EQ(env.takeException(), cancelled);
  EXPECT_FALSE(filtered(file, 0).empty());
  calls.freeCancel(handle);
  filtered(file, handle);
  EXPECT_EQ(env.takeException(), "java/lang/IllegalArgumentException: cancel: no such handle");
  calls.cancel(handle);  // which does nothing any more
  calls.freeCancel(handle);
  calls.freeCancel(other);
}

TEST_F(PhotoNatives, EndACallAtWorkThatAnotherThreadCancels) {
  FakeBytes large(turnedPhoto(1600, 1200));
  const jlong handle = calls.newCancel();
  int calledOff = 0;
  std::thread another([&] {
    FakeEnvironment own;
    std::this_thread::sleep_for(std::chrono::milliseconds(1));
    PhotoCalls{own}.cancel(handle);
  });
  // One of the calls is at work when it happens, or about to begin.
  for (int i = 0; i < 1000 && calledOff == 0; ++i) {
    filtered(large, handle);
    if (env.takeException().find("CancellationException") != std::string::npos) ++calledOff;
  }
  another.join();
  EXPECT_EQ(calledOff, 1);
  calls.freeCancel(handle);
}

TEST_F(PhotoNatives, ServeEightThreadsWithTheSameBytes) {
  const Bytes expected = filtered(file);
  const float score = calls.niqe(file);
  std::vector<std::thread> threads;
  for (int i = 0; i < 8; ++i) {
    threads.emplace_back([&] {
      FakeEnvironment own;
      const PhotoCalls mine{own};
      FakeBytes copy(file.bytes);
      FakeString filter("AE0"), params("slider=0.4;");
      for (int round = 0; round < 5; ++round) {
        const jlong handle = mine.newCancel();
        EXPECT_EQ(mine.filter(copy, nullptr, 0, static_cast<jint>(copy.bytes.size()), 90, 0,
                              nullptr, 1, filter, params, handle),
                  expected);
        mine.freeCancel(handle);
        EXPECT_EQ(mine.niqe(copy), score);
      }
      EXPECT_EQ(own.takeException(), "");
      EXPECT_EQ(own.violations(), "");
    });
  }
  for (std::thread& thread : threads) thread.join();
}

TEST_F(PhotoNatives, TellWhatOfTheMetadataIsLost) {
  Bytes two = file.bytes;
  const Bytes second = smallJpeg();
  two.insert(two.end(), second.begin(), second.end());
  FakeBytes from(two);
  FakeSlot lost;
  calls.filter(from, nullptr, 0, static_cast<jint>(two.size()), 90, 0, nullptr, 1, ae, slider, 0, 0,
               JNI_TRUE, lost);
  const Bytes& told = lost.content.bytes;
  EXPECT_EQ(std::string(told.begin(), told.end()),
            std::string("second picture\0shows the picture as it was\0", 43));
}

class PhotoNativesUnderFaults : public PhotoNatives {
 protected:
  using Native = std::function<void()>;

  // Nothing here allocates, nor keeps what natives return.
  std::vector<Native> natives() {
    const auto measured = [this](const char* nameAndSignature) {
      return [this, nameAndSignature] {
        env.DeleteLocalRef(calls.call<jobject>(nameAndSignature, array(), jobject{}, jint{0},
                                               size(), jlong{0}, jlong{0}, jlong{0}, jint{0},
                                               jint{0}));
      };
    };
    return {[this] {
              env.DeleteLocalRef(calls.call<jobject>(
                  "filter([BLjava/nio/ByteBuffer;IIIII[FILjava/lang/String;Ljava/lang/"
                  "String;ZJ[[BJJIIZ)[B",
                  array(), jobject{}, jint{0}, size(), jint{90}, jint{0}, jint{90},
                  static_cast<jfloatArray>(faces), jint{1}, static_cast<jstring>(ae),
                  static_cast<jstring>(slider), jboolean{JNI_TRUE}, jlong{0},
                  static_cast<jobjectArray>(lost), jlong{0}, jlong{0}, jint{0}, jint{0},
                  jboolean{JNI_FALSE}));
            },
            [this] {
              calls.call<jfloat>("niqe([BLjava/nio/ByteBuffer;IIJJJII)F", array(), jobject{},
                                 jint{0}, size(), jlong{0}, jlong{0}, jlong{0}, jint{0}, jint{0});
            },
            measured("niqeFeatures([BLjava/nio/ByteBuffer;IIJJJII)[F"),
            measured("greenCdf([BLjava/nio/ByteBuffer;IIJJJII)[F"),
            [this] {
              env.DeleteLocalRef(calls.call<jobject>("facts([BLjava/nio/ByteBuffer;IIJJII)[D",
                                                     array(), jobject{}, jint{0}, size(), jlong{0},
                                                     jlong{0}, jint{0}, jint{0}));
            }};
  }

  jbyteArray array() { return small; }
  jint size() const { return static_cast<jint>(small.bytes.size()); }

  FakeFloats faces{std::vector<float>{0.1f, 0.2f, 0.5f, 0.6f}};
  FakeSlot lost;
  FakeBytes small{jpegOf(photoLikePicture(100, 98, 2))};
};

TEST_F(PhotoNativesUnderFaults, RaiseOutOfMemoryAndLeakNothing) {
  using Later = AllocationFaults::Later;
  for (const Native& native : natives()) {
    native();  // makes what lives as long as the process
    native();
    long faults = 0, noticed = 0;
    for (const Later later : {Later::succeed, Later::fail}) {
      for (long failing = 1, count = failing; count >= failing; ++failing) {
        const long blocks = blocksInUse();
        {
          const AllocationFaults fault(failing, later);
          native();
          count = fault.count();
        }
        if (env.pending()) {
          EXPECT_EQ(env.takeException(), "java/lang/OutOfMemoryError: out of native memory");
          ++noticed;
        }
        EXPECT_EQ(env.violations(), "");
        ++faults;
        if (HasFailure()) return;
        EXPECT_EQ(blocksInUse(), blocks) << "leaked at allocation " << failing;
      }
    }
    EXPECT_GT(noticed, 0);
    printf("%ld injected faults, %ld noticed\n", faults, noticed);
    native();
    EXPECT_FALSE(env.pending());
  }
}

TEST_F(PhotoNativesUnderFaults, LeaveTheExceptionOfAFailingCallPending) {
  using Failure = FakeEnvironment::Failure;
  using Later = FakeEnvironment::Later;
  std::vector<Native> all = natives();
  all.push_back([this] { env.DeleteLocalRef(calls.call<jobject>("version()Ljava/lang/String;")); });
  const std::vector<Native> refusing = natives();
  const Bytes whole = small.bytes;
  int faults = 0;
  const auto failEachCall = [&](const Native& native) {
    env.failCall(0);
    native();
    env.takeException();
    const int fallible = env.fallibleCalls();
    for (int call = 1; call <= fallible; ++call) {
      for (const Failure failure : {Failure::withException, Failure::withoutException}) {
        for (const Later later : {Later::succeed, Later::fail}) {
          env.failCall(call, failure, later);
          native();
          EXPECT_TRUE(env.failed());
          env.failCall(0);
          const std::string exception = env.takeException();
          if (failure == Failure::withException) {
            EXPECT_THAT(exception, StartsWith("test/Injected: "));
          }
          EXPECT_EQ(env.violations(), "");
          ++faults;
        }
      }
    }
  };
  for (const Native& native : all) failEachCall(native);
  for (const Bytes& refused : {Bytes{}, Bytes{'t', 'e', 'x', 't'}}) {
    small.bytes = refused;
    for (const Native& native : refusing) failEachCall(native);
  }
  small.bytes = whole;
  for (const Native& native : all) {
    native();
    EXPECT_FALSE(env.pending());
  }
  EXPECT_GE(faults, 200);
  printf("%d failing calls\n", faults);
}

TEST_F(PhotoNatives, NeedTheirJavaClass) {
  env.missing = "com/pelorin/photos/quenby/autoenhance/PhotoBytes";
  EXPECT_EQ(jni::initialize(FakeEnvironment::machine(), quenby::registerPhotoNatives), JNI_ERR);
  EXPECT_THAT(env.takeException(), StartsWith("java/lang/NoClassDefFoundError"));
}

}  // namespace
}  // namespace pelorin::test_support
