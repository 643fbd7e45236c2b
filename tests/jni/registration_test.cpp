#include "jni/registration.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <utility>
#include <vector>

#include "image_processing/core/never_destroyed.h"
#include "jni/load_time_cache.h"
#include "platform/pn/jni_lookup.h"
#include "tests/jni/support/fake_environment.h"

extern "C" jint JNI_OnLoad(JavaVM* vm, void* reserved);
extern "C" void JNI_OnUnload(JavaVM* vm, void* reserved);

namespace pelorin::quenby {
namespace {

using test_support::FakeEnvironment;

class Registration : public testing::Test {
 protected:
  ~Registration() override { EXPECT_EQ(env.violations(), ""); }

  FakeEnvironment env;
};

TEST_F(Registration, NamesTheSixNatives) {
  FakeEnvironment::registered().clear();
  ASSERT_EQ(JNI_OnLoad(FakeEnvironment::machine(), nullptr), JNI_VERSION_1_6);
  std::vector<std::string> names;
  for (const auto& [name, function] : FakeEnvironment::registered()) names.push_back(name);
  EXPECT_THAT(names,
              testing::ElementsAre(
                  "applyAutoEnhanceFilter(JLandroid/graphics/Bitmap;Ljava/lang/String;"
                  "Ljava/lang/String;)V",
                  "applyAutoEnhanceFilterToJpegFile(Ljava/lang/String;Ljava/lang/String;I"
                  "[Landroid/graphics/RectF;ILjava/lang/String;Ljava/lang/String;)Z",
                  "init(Landroid/graphics/Bitmap;)J", "preprocess([Landroid/graphics/RectF;J)V",
                  "releaseSession(J)V",
                  "similarityScore(Landroid/graphics/Bitmap;DILandroid/graphics/Bitmap;DI)F"));
}

/// What one call to RegisterNatives gave, in order: the class, then names and signatures.
std::vector<std::vector<std::string>> tablesGiven;
jint (*registerInFake)(JNIEnv*, jclass, const JNINativeMethod*, jint);

jint JNICALL recordTable(JNIEnv* env, jclass owner, const JNINativeMethod* methods, jint count) {
  const auto* const object = static_cast<FakeEnvironment*>(env)->resolve(owner, "the test");
  std::vector<std::string>& table = tablesGiven.emplace_back(1, object->text);
  for (jint i = 0; i < count; ++i) {
    table.push_back(std::string(methods[i].name) + methods[i].signature);
  }
  return registerInFake(env, owner, methods, count);
}

TEST_F(Registration, GivesEachClassItsTableInOrder) {
  JNINativeInterface_ recording = *env.functions;
  registerInFake = std::exchange(recording.RegisterNatives, recordTable);
  env.functions = &recording;
  tablesGiven.clear();
  ASSERT_EQ(JNI_OnLoad(FakeEnvironment::machine(), nullptr), JNI_VERSION_1_6);
  using testing::ElementsAre;
  EXPECT_THAT(
      tablesGiven,
      ElementsAre(
          ElementsAre("com/pelorin/photos/quenby/autoenhance/QuenbyEngine",
                      "init(Landroid/graphics/Bitmap;)J", "preprocess([Landroid/graphics/RectF;J)V",
                      "releaseSession(J)V",
                      "applyAutoEnhanceFilter(JLandroid/graphics/Bitmap;Ljava/lang/String;"
                      "Ljava/lang/String;)V",
                      "applyAutoEnhanceFilterToJpegFile(Ljava/lang/String;Ljava/lang/String;I"
                      "[Landroid/graphics/RectF;ILjava/lang/String;Ljava/lang/String;)Z"),
          ElementsAre("com/pelorin/photos/quenby/autoenhance/ImageDupeDetector",
                      "similarityScore(Landroid/graphics/Bitmap;DILandroid/graphics/Bitmap;DI)F")));
}

TEST_F(Registration, ReadsTheErrorValueOfTheJavaClass) {
  FakeEnvironment::similarityError = -7.5f;
  ASSERT_EQ(JNI_OnLoad(FakeEnvironment::machine(), nullptr), JNI_VERSION_1_6);
  EXPECT_EQ(loadTimeCache.similarityError, -7.5f);
  FakeEnvironment::similarityError = -2222.0f;
}

TEST(LoadTimeCache, HasAnErrorValueBeforeJavaIsAsked) {
  EXPECT_EQ(LoadTimeCache().similarityError, -2222.0f);
}

TEST_F(Registration, HoldsOneWeakReferenceHoweverOftenItRuns) {
  for (int i = 0; i < 3; ++i) {
    ASSERT_EQ(JNI_OnLoad(FakeEnvironment::machine(), nullptr), JNI_VERSION_1_6);
    if (i == 0) env.weakReferences = 1;  // another test's may have been given up
    EXPECT_EQ(env.weakReferences, 1);
    EXPECT_EQ(env.globalReferences, 0);
  }
}

TEST_F(Registration, IsUndoneWhenTheLibraryGoes) {
  ASSERT_EQ(JNI_OnLoad(FakeEnvironment::machine(), nullptr), JNI_VERSION_1_6);
  env.weakReferences = 1;
  for (int i = 0; i < 2; ++i) {
    JNI_OnUnload(FakeEnvironment::machine(), nullptr);
    EXPECT_EQ(env.weakReferences, 0);
    EXPECT_TRUE(std::exchange(image_processing::libraryIsUnloaded, false));
  }
}

TEST_F(Registration, FailsForAMissingClassOrMember) {
  const std::string package = "com/pelorin/photos/quenby/autoenhance/";
  for (const std::string& missing :
       {std::string("android/graphics/RectF"), std::string("android/graphics/RectF.left"),
        std::string("android/graphics/RectF.top"), std::string("android/graphics/RectF.right"),
        std::string("android/graphics/RectF.bottom"), package + "QuenbyEngine",
        package + "ImageDupeDetector", package + "ImageDupeDetector.SIMILARITY_ERROR"}) {
    env.missing = missing;
    EXPECT_EQ(JNI_OnLoad(FakeEnvironment::machine(), nullptr), JNI_ERR) << missing;
    EXPECT_THAT(env.takeException(), testing::AnyOf(testing::StartsWith("java/lang/NoSuchField"),
                                                    testing::StartsWith("java/lang/NoClassDef")))
        << missing;
  }
}

TEST_F(Registration, LetsTheErrorOfALookUpThrough) {
  env.missing = "android/graphics/RectF";
  EXPECT_THROW(registerQuenbyFilterNatives(), JniError);
  env.takeException();
  env.missing = "com/pelorin/photos/quenby/autoenhance/ImageDupeDetector";
  EXPECT_THROW(registerImageDupeDetectorNatives(), JniError);
  env.takeException();
}

TEST_F(Registration, FailsWithWhateverCallFails) {
  using Failure = FakeEnvironment::Failure;
  using Later = FakeEnvironment::Later;
  env.failCall(0);
  ASSERT_EQ(JNI_OnLoad(FakeEnvironment::machine(), nullptr), JNI_VERSION_1_6);
  const int calls = env.fallibleCalls();
  // RectF and its fields, a weak reference, then find and register twice, then find and look up.
  EXPECT_EQ(calls, 6 + 2 + 2 + 2);
  int faults = 0;
  for (int call = 1; call <= calls; ++call) {
    for (const Failure failure : {Failure::withException, Failure::withoutException}) {
      for (const Later later : {Later::succeed, Later::fail}) {
        const int references = env.weakReferences;
        env.failCall(call, failure, later);
        EXPECT_EQ(JNI_OnLoad(FakeEnvironment::machine(), nullptr), JNI_ERR) << call;
        const bool told = failure == Failure::withException || later == Later::succeed;
        EXPECT_EQ(env.takeException() != "", told) << call;
        EXPECT_EQ(env.weakReferences, references) << call;
        ++faults;
      }
    }
  }
  printf("%d failing calls\n", faults);
}

}  // namespace
}  // namespace pelorin::quenby
