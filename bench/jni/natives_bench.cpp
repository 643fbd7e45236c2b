#include <benchmark/benchmark.h>
#include <hwy/targets.h>
#include <jni.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "tests/support/pictures.h"

namespace pelorin::quenby {
namespace {

using namespace image_processing;

JNIEnv* startJava() {
  std::string options[] = {"-Djava.class.path=" QUENBY_CLASS_PATH,
                           "-Dquenby.library=" QUENBY_LIBRARIES, "-Xmx512m"};
  JavaVMOption given[3] = {};
  for (int i = 0; i < 3; ++i) given[i].optionString = options[i].data();
  JavaVMInitArgs arguments{JNI_VERSION_1_8, 3, given, JNI_FALSE};
  JavaVM* vm;
  void* env;
  if (JNI_CreateJavaVM(&vm, &env, &arguments) != JNI_OK) {
    std::fputs("no Java virtual machine\n", stderr);
    std::exit(1);
  }
  return static_cast<JNIEnv*>(env);
}

/// The natives and what they are called with, for one size.
class JavaSide {
 public:
  JavaSide(std::uint32_t width, std::uint32_t height) : env(environment()) {
    checked(env->PushLocalFrame(32));
    const jclass library =
        checked(env->FindClass("com/pelorin/photos/quenby/autoenhance/NativeLibrary"));
    env->CallStaticVoidMethod(library, checked(env->GetStaticMethodID(library, "load", "()V")));
    check();
    const char* const engineName = "com/pelorin/photos/quenby/autoenhance/QuenbyEngine";
    const jclass engineClass = checked(env->FindClass(engineName));
    engine = checked(
        env->NewObject(engineClass, checked(env->GetMethodID(engineClass, "<init>", "()V"))));
    init = checked(env->GetMethodID(engineClass, "init", "(Landroid/graphics/Bitmap;)J"));
    preprocess =
        checked(env->GetMethodID(engineClass, "preprocess", "([Landroid/graphics/RectF;J)V"));
    release = checked(env->GetMethodID(engineClass, "releaseSession", "(J)V"));
    apply = checked(
        env->GetMethodID(engineClass, "applyAutoEnhanceFilter",
                         "(JLandroid/graphics/Bitmap;Ljava/lang/String;Ljava/lang/String;)V"));
    photo = newBitmap(width, height);
    output = newBitmap(width, height);
    const Image<RGBA8Pixel> picture = test_support::photoLikePicture(width, height, 1);
    const jobject bytes = checked(
        env->NewDirectByteBuffer(picture.data.get(), static_cast<jlong>(picture.byteSize())));
    const jclass bitmap = env->GetObjectClass(photo);
    env->CallVoidMethod(
        photo, checked(env->GetMethodID(bitmap, "copyPixelsFromBuffer", "(Ljava/nio/Buffer;)V")),
        bytes);
    check();
  }

  ~JavaSide() { env->PopLocalFrame(nullptr); }
  JavaSide(const JavaSide&) = delete;
  JavaSide& operator=(const JavaSide&) = delete;

  jlong open() const {
    const jlong handle = env->CallLongMethod(engine, init, photo);
    check();
    return handle;
  }

  void check() const {
    if (!env->ExceptionCheck()) return;
    env->ExceptionDescribe();
    std::exit(1);
  }

  template <typename T>
  T checked(T value) const {
    check();
    return value;
  }

  JNIEnv* env;
  jobject engine, photo, output;
  jmethodID init, preprocess, release, apply;

 private:
  static JNIEnv* environment() {
    static JNIEnv* const env = startJava();
    return env;
  }

  jobject newBitmap(std::uint32_t width, std::uint32_t height) const {
    const jclass bitmap = checked(env->FindClass("android/graphics/Bitmap"));
    const jclass config = checked(env->FindClass("android/graphics/Bitmap$Config"));
    const jobject argb = env->GetStaticObjectField(
        config,
        checked(env->GetStaticFieldID(config, "ARGB_8888", "Landroid/graphics/Bitmap$Config;")));
    return checked(env->CallStaticObjectMethod(
        bitmap,
        checked(env->GetStaticMethodID(
            bitmap, "createBitmap",
            "(IILandroid/graphics/Bitmap$Config;)Landroid/graphics/Bitmap;")),
        static_cast<jint>(width), static_cast<jint>(height), argb));
  }
};

// PassThrough on one pixel: what is left is the way there and back.
void oneCallDirect(benchmark::State& state) {
  auto photo = makeSharedImage<RGBA8Pixel>(1, 1);
  photo->set({1, 2, 3, 4});
  FilteredImage session(photo, ImageMetadata{}, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
  for (auto _ : state) {
    Image<RGBA8Pixel> output(1, 1);
    session.applyFilterWithParams("PassThrough", "", defaultFilterConfigValue, output);
    benchmark::DoNotOptimize(output.data.get());
  }
}
BENCHMARK(oneCallDirect)->Unit(benchmark::kMicrosecond);

// One call after the other, each with the next of `parameters`.
void applyLoop(benchmark::State& state, const JavaSide& java, const char* filter,
               const std::vector<const char*>& parameters) {
  const jstring name = java.env->NewStringUTF(filter);
  std::vector<jstring> params;
  for (const char* text : parameters) params.push_back(java.env->NewStringUTF(text));
  std::size_t next = 0;
  const jlong handle = java.open();
  java.env->CallVoidMethod(java.engine, java.preprocess, nullptr, handle);
  const auto call = [&] {
    java.env->CallVoidMethod(java.engine, java.apply, handle, java.output, name,
                             params[next++ % params.size()]);
    java.check();
  };
  call();  // prepares the filter
  for (auto _ : state) call();
  java.env->CallVoidMethod(java.engine, java.release, handle);
}

void oneCallThroughJava(benchmark::State& state) {
  applyLoop(state, JavaSide(1, 1), "PassThrough", {""});
}
BENCHMARK(oneCallThroughJava)->Unit(benchmark::kMicrosecond);

struct Size {
  std::uint32_t width, height;
};

Size sizeOf(const benchmark::State& state) {
  return state.range(0) == 2 ? Size{1632, 1224} : Size{4000, 3000};
}

void init(benchmark::State& state) {
  const JavaSide java(sizeOf(state).width, sizeOf(state).height);
  for (auto _ : state) {
    const jlong handle = java.open();
    java.env->CallVoidMethod(java.engine, java.release, handle);
  }
}
BENCHMARK(init)->ArgName("megapixels")->Arg(2)->Arg(12)->Unit(benchmark::kMillisecond);

void applyThroughJava(benchmark::State& state) {
  applyLoop(state, JavaSide(sizeOf(state).width, sizeOf(state).height), "AE0", {"slider=0.4;"});
}
BENCHMARK(applyThroughJava)->ArgName("megapixels")->Arg(2)->Arg(12)->Unit(benchmark::kMillisecond);

// A slider on its way, in pictures a second; on request as on a machine without AVX-512.
void sliderThroughJava(benchmark::State& state) {
  const bool avx512 = state.range(1) != 0;
  if (!avx512) hwy::SetSupportedTargetsForTest(hwy::SupportedTargets() & ~(HWY_AVX2 - 1));
  applyLoop(state, JavaSide(sizeOf(state).width, sizeOf(state).height), "AE0",
            {"slider=0.1;", "slider=0.2;", "slider=0.3;", "slider=0.4;", "slider=0.5;",
             "slider=0.6;", "slider=0.7;", "slider=0.8;"});
  hwy::SetSupportedTargetsForTest(0);
  state.counters["pictures/s"] =
      benchmark::Counter(1, benchmark::Counter::kIsIterationInvariantRate);
}
BENCHMARK(sliderThroughJava)
    ->ArgNames({"megapixels", "avx512"})
    ->ArgsProduct({{2, 12}, {0, 1}})
    ->UseRealTime()
    ->Unit(benchmark::kMillisecond);

void applyDirect(benchmark::State& state) {
  const auto [width, height] = sizeOf(state);
  auto photo =
      std::make_shared<Image<RGBA8Pixel>>(test_support::photoLikePicture(width, height, 1));
  FilteredImage session(photo, ImageMetadata{}, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
  Image<RGBA8Pixel> output(photo->width, photo->height);
  const auto call = [&] {
    session.applyFilterWithParams("AE0", "slider=0.4;", defaultFilterConfigValue, output);
    benchmark::DoNotOptimize(output.data.get());
  };
  call();
  for (auto _ : state) call();
}
BENCHMARK(applyDirect)->ArgName("megapixels")->Arg(2)->Arg(12)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace pelorin::quenby
