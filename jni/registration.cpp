#include "jni/registration.h"

#include <utility>

#include "jni/load_time_cache.h"
#include "jni/native_methods.h"
#include "jni/natives.h"
#include "platform/pn/jni_lookup.h"
#include "platform/pnjni/environment.h"
#include "platform/pnjni/exceptions.h"
#include "platform/pnjni/local_reference.h"

namespace pelorin::quenby {

using jni::Environment;
using jni::exceptionWrapJNIMethod;
using jni::LocalReference;
using jni::throwCppExceptionIf;

namespace {

constexpr const char* engineClass = "com/pelorin/photos/quenby/autoenhance/QuenbyEngine";
constexpr const char* dupeDetectorClass = "com/pelorin/photos/quenby/autoenhance/ImageDupeDetector";

void cacheRectF(JNIEnv* env) {
  const LocalReference<jclass> rectF(env, findClassOrThrow(env, "android/graphics/RectF"));
  loadTimeCache.left = getFieldIdOrThrow(env, rectF.get(), "left", "F");
  loadTimeCache.top = getFieldIdOrThrow(env, rectF.get(), "top", "F");
  loadTimeCache.right = getFieldIdOrThrow(env, rectF.get(), "right", "F");
  loadTimeCache.bottom = getFieldIdOrThrow(env, rectF.get(), "bottom", "F");
  const jweak weak = env->NewWeakGlobalRef(rectF.get());
  throwCppExceptionIf(weak == nullptr);
  forgetJava(env);
  loadTimeCache.rectF = weak;
}

}  // namespace

void registerQuenbyFilterNatives() {
  cacheRectF(Environment::current());
  const JNINativeMethod methods[] = {
      nativeMethod("init", "(Landroid/graphics/Bitmap;)J", exceptionWrapJNIMethod<&init>()),
      nativeMethod("preprocess", "([Landroid/graphics/RectF;J)V",
                   exceptionWrapJNIMethod<&preprocess>()),
      nativeMethod("releaseSession", "(J)V", exceptionWrapJNIMethod<&releaseSession>()),
      nativeMethod("applyAutoEnhanceFilter",
                   "(JLandroid/graphics/Bitmap;Ljava/lang/String;Ljava/lang/String;)V",
                   exceptionWrapJNIMethod<&applyAutoEnhanceFilter>()),
      nativeMethod("applyAutoEnhanceFilterToJpegFile",
                   "(Ljava/lang/String;Ljava/lang/String;I[Landroid/graphics/RectF;I"
                   "Ljava/lang/String;Ljava/lang/String;)Z",
                   exceptionWrapJNIMethod<&applyAutoEnhanceFilterToJpegFile>()),
  };
  registerNatives(engineClass, methods);
}

void registerImageDupeDetectorNatives() {
  const JNINativeMethod methods[] = {
      nativeMethod("similarityScore", "(Landroid/graphics/Bitmap;DILandroid/graphics/Bitmap;DI)F",
                   exceptionWrapJNIMethod<&similarityScore>()),
  };
  registerNatives(dupeDetectorClass, methods);

  JNIEnv* const env = Environment::current();
  const LocalReference<jclass> owner(env, findClassOrThrow(env, dupeDetectorClass));
  const jfieldID field = env->GetStaticFieldID(owner.get(), "SIMILARITY_ERROR", "F");
  throwCppExceptionIf(field == nullptr);
  loadTimeCache.similarityError = env->GetStaticFloatField(owner.get(), field);
}

void forgetJava(JNIEnv* env) {
  const jweak rectF = std::exchange(loadTimeCache.rectF, nullptr);
  if (rectF != nullptr) env->DeleteWeakGlobalRef(rectF);
}

}  // namespace pelorin::quenby
