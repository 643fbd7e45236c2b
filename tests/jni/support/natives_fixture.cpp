#include "tests/jni/support/natives_fixture.h"

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"

extern "C" jint JNI_OnLoad(JavaVM* vm, void* reserved);

namespace pelorin::test_support {

using image_processing::Image;
using image_processing::RGBA8Pixel;

FakeFaces::FakeFaces(std::initializer_list<Rectangle> rectangles) {
  storage_.reserve(rectangles.size());
  for (const Rectangle& rectangle : rectangles) {
    storage_.push_back({.className = "android/graphics/RectF",
                        .floats = {{"left", rectangle.left},
                                   {"top", rectangle.top},
                                   {"right", rectangle.right},
                                   {"bottom", rectangle.bottom}}});
    elements.push_back(&storage_.back());
  }
}

namespace {

template <typename Result, typename... Arguments>
Result call(FakeEnvironment& env, const char* nameAndSignature, Arguments... arguments) {
  const auto function = reinterpret_cast<Result (*)(JNIEnv*, jobject, Arguments...)>(
      FakeEnvironment::registered().find(std::string_view(nameAndSignature))->second);
  return function(&env, nullptr, arguments...);
}

}  // namespace

Natives Natives::load(FakeEnvironment& env) {
  EXPECT_EQ(JNI_OnLoad(FakeEnvironment::machine(), nullptr), JNI_VERSION_1_6);
  return Natives(env);
}

jlong Natives::init(jobject bitmap) const {
  return call<jlong>(env_, "init(Landroid/graphics/Bitmap;)J", bitmap);
}

void Natives::preprocess(jobjectArray faces, jlong handle) const {
  call<void>(env_, "preprocess([Landroid/graphics/RectF;J)V", faces, handle);
}

void Natives::apply(jlong handle, jobject bitmap, jstring filter, jstring params) const {
  call<void>(env_,
             "applyAutoEnhanceFilter(JLandroid/graphics/Bitmap;Ljava/lang/String;"
             "Ljava/lang/String;)V",
             handle, bitmap, filter, params);
}

void Natives::release(jlong handle) const {
  call<void>(env_, "releaseSession(J)V", handle);
}

bool Natives::applyToFile(jstring input, jstring output, jint rotation, jobjectArray faces,
                          jint scale, jstring filter, jstring params) const {
  return call<jboolean>(env_,
                        "applyAutoEnhanceFilterToJpegFile(Ljava/lang/String;Ljava/lang/String;I"
                        "[Landroid/graphics/RectF;ILjava/lang/String;Ljava/lang/String;)Z",
                        input, output, rotation, faces, scale, filter, params) != JNI_FALSE;
}

float Natives::similarity(jobject bitmap1, double time1, jint orientation1, jobject bitmap2,
                          double time2, jint orientation2) const {
  return call<jfloat>(env_,
                      "similarityScore(Landroid/graphics/Bitmap;DILandroid/graphics/Bitmap;DI)F",
                      bitmap1, time1, orientation1, bitmap2, time2, orientation2);
}

NativesTest::NativesTest() : natives(Natives::load(env)) {
  takeLogLines();
}

NativesTest::~NativesTest() {
  EXPECT_EQ(env.takeException(), "") << "an exception the test did not look at";
  EXPECT_EQ(env.violations(), "");
}

std::vector<std::string> filterNames() {
  std::vector<std::string> names;
  for (const auto& [name, description] :
       image_processing::DefaultFilterFactory::filterFactory()->descriptions)
    names.push_back(name);
  return names;
}

std::vector<std::uint8_t> bytesOf(const Image<RGBA8Pixel>& image) {
  const auto* const first = &image.data.get()->r;
  return {first, first + image.byteSize()};
}

std::vector<std::uint8_t> engineResult(const Image<RGBA8Pixel>& photo, const std::string& filter,
                                       const std::string& params) {
  using namespace image_processing;
  auto source = std::make_shared<Image<RGBA8Pixel>>(photo);
  FilteredImage session(source, ImageMetadata{}, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
  Image<RGBA8Pixel> output(photo.width, photo.height);
  EXPECT_TRUE(session.applyFilterWithParams(filter, params, defaultFilterConfigValue, output));
  return bytesOf(output);
}

}  // namespace pelorin::test_support
