#include "jni/add_faceboxes.h"

#include "image_processing/core/float_to_integer.h"
#include "jni/load_time_cache.h"
#include "jni/log.h"
#include "platform/pnjni/exceptions.h"
#include "platform/pnjni/local_reference.h"

namespace pelorin::quenby {

using image_processing::BoundingBox;
using image_processing::truncateTo;

void addFaceboxes(JNIEnv* env, jobjectArray faces, std::uint32_t width, std::uint32_t height,
                  image_processing::ImageMetadata& metadata) {
  if (faces == nullptr) return;
  const auto pixels = [&](jobject face, jfieldID fraction, std::uint32_t side) {
    return truncateTo<std::int32_t>(env->GetFloatField(face, fraction) * static_cast<float>(side));
  };
  const jsize count = env->GetArrayLength(faces);
  for (jsize i = 0; i < count; ++i) {
    const jni::LocalReference<jobject> face(env, env->GetObjectArrayElement(faces, i));
    jni::throwCppExceptionIf(env->ExceptionCheck());
    if (face.get() == nullptr) continue;
    const BoundingBox box{.left = pixels(face.get(), loadTimeCache.left, width),
                          .right = pixels(face.get(), loadTimeCache.right, width),
                          .bottom = pixels(face.get(), loadTimeCache.bottom, height),
                          .top = pixels(face.get(), loadTimeCache.top, height)};
    pn_printLog(logDebug, logTag, "face bb: [%d %d %d %d]", box.left, box.right, box.bottom,
                box.top);
    metadata.faces.push_back(std::make_shared<BoundingBox>(box));
  }
}

}  // namespace pelorin::quenby
