#include "jni/add_faceboxes.h"

#include "image_processing/core/face_fractions.h"
#include "jni/load_time_cache.h"
#include "jni/log.h"
#include "platform/pnjni/exceptions.h"
#include "platform/pnjni/local_reference.h"

namespace pelorin::quenby {

using image_processing::BoundingBox;
using image_processing::FaceFractions;

void addFaceboxes(JNIEnv* env, jobjectArray faces, std::uint32_t width, std::uint32_t height,
                  image_processing::ImageMetadata& metadata) {
  if (faces == nullptr) return;
  const jsize count = env->GetArrayLength(faces);
  for (jsize i = 0; i < count; ++i) {
    const jni::LocalReference<jobject> face(env, env->GetObjectArrayElement(faces, i));
    jni::throwCppExceptionIf(env->ExceptionCheck());
    if (face.get() == nullptr) continue;
    const FaceFractions fractions{.left = env->GetFloatField(face.get(), loadTimeCache.left),
                                  .top = env->GetFloatField(face.get(), loadTimeCache.top),
                                  .right = env->GetFloatField(face.get(), loadTimeCache.right),
                                  .bottom = env->GetFloatField(face.get(), loadTimeCache.bottom)};
    const BoundingBox box =
        boxInPixels(fractions, static_cast<float>(width), static_cast<float>(height));
    pn_printLog(logDebug, logTag, "face bb: [%d %d %d %d]", box.left, box.right, box.bottom,
                box.top);
    metadata.faces.push_back(std::make_shared<BoundingBox>(box));
  }
}

}  // namespace pelorin::quenby
