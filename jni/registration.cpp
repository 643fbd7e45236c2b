#include "jni/registration.h"

#include <span>
#include <utility>

#include "jni/load_time_cache.h"
#include "jni/natives.h"
#include "platform/pn/jni_lookup.h"
#include "platform/pnjni/environment.h"
#include "platform/pnjni/exceptions.h"
#include "platform/pnjni/local_reference.h"

namespace pelorin::quenby {

using jni::Environment;
using jni::exceptionWrapJNIMethod;
using jni::findClassLocal;
using jni::LocalReference;
using jni::throwCppExceptionIf;

namespace {

constexpr const char* engineClass = "com/pelorin/photos/quenby/autoenhance/QuenbyEngine";
constexpr const char* dupeDetectorClass = "com/pelorin/photos/quenby/autoenhance/ImageDupeDetector";

JNINativeMethod method(const char* name, const char* signature, void* function) {
  // Some versions of jni.h want char*; nobody writes there.
  return {const_cast<char*>(name), const_cast<char*>(signature), function};
}

void registerNatives(const char* className, std::span<const JNINativeMethod> methods) {
  const LocalReference<jclass> owner = findClassLocal(className);
  const jint result = Environment::current()->RegisterNatives(owner.get(), methods.data(),
                                                              static_cast<jint>(methods.size()));
  throwCppExceptionIf(result != 0);
}

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
      method("init", "(Landroid/graphics/Bitmap;)J", exceptionWrapJNIMethod<&init>()),
      method("preprocess", "([Landroid/graphics/RectF;J)V", exceptionWrapJNIMethod<&preprocess>()),
      method("releaseSession", "(J)V", exceptionWrapJNIMethod<&releaseSession>()),
      method("applyAutoEnhanceFilter",
             "(JLandroid/graphics/Bitmap;Ljava/lang/String;Ljava/lang/String;)V",
             exceptionWrapJNIMethod<&applyAutoEnhanceFilter>()),
      method("applyAutoEnhanceFilterToJpegFile",
             "(Ljava/lang/String;Ljava/lang/String;I[Landroid/graphics/RectF;I"
             "Ljava/lang/String;Ljava/lang/String;)Z",
             exceptionWrapJNIMethod<&applyAutoEnhanceFilterToJpegFile>()),
  };
  registerNatives(engineClass, methods);
}

void registerImageDupeDetectorNatives() {
  const JNINativeMethod methods[] = {
      method("similarityScore", "(Landroid/graphics/Bitmap;DILandroid/graphics/Bitmap;DI)F",
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
