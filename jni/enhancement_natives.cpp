#include <new>
#include <string>
#include <utility>

#include "image_processing/filters/default_filter_factory.h"
#include "jni/add_faceboxes.h"
#include "jni/bitmap_pixels_lock.h"
#include "jni/bitmap_rows.h"
#include "jni/filter_or_copy.h"
#include "jni/java_string.h"
#include "jni/log.h"
#include "jni/natives.h"
#include "jni/session_table.h"
#include "platform/pn/jni_lookup.h"

namespace pelorin::quenby {

using image_processing::defaultFilterConfigValue;
using image_processing::DefaultFilterFactory;
using image_processing::FilteredImage;
using image_processing::Image;
using image_processing::ImageMetadata;
using image_processing::RGBA8Pixel;

namespace {

void copyToBitmap(JNIEnv* env, const Image<RGBA8Pixel>& image, jobject bitmap) {
  const BitmapPixelsLock lock(env, bitmap);
  AndroidBitmapInfo info;
  if (!queryLockedBitmap(env, bitmap, lock, info)) return;
  if (info.width < image.width || info.height < image.height) {
    pn_printLog(logError, logTag, "the output bitmap [%u, %u] is smaller than the photo [%u, %u]",
                info.width, info.height, image.width, image.height);
    return;
  }
  const std::size_t rowBytes = image.width * sizeof(RGBA8Pixel);
  copyRows(image.data.get(), rowBytes, lock.pixels(), info.stride, rowBytes, image.height);
}

}  // namespace

jlong init(JNIEnv* env, jobject, jobject bitmap) {
  AndroidBitmapInfo info;
  if (!queryBitmap(env, bitmap, info)) return 0;
  const BitmapPixelsLock lock(env, bitmap);
  if (!queryLockedBitmap(env, bitmap, lock, info)) return 0;
  pn_printLog(logDebug, logTag, "== QBE: init [%d, %d]", static_cast<int>(info.width),
              static_cast<int>(info.height));
  try {
    return openSessions().open(std::make_shared<QuenbySession>(copyOfPixels(info, lock.pixels())));
  } catch (const std::bad_alloc&) {
    throwOutOfMemoryError(env, "QuenbyLib init ran out of memory");
    return 0;
  }
}

void preprocess(JNIEnv* env, jobject, jobjectArray faces, jlong handle) {
  const std::shared_ptr<QuenbySession> session = openSessions().find(handle);
  if (session == nullptr) return;
  try {
    ImageMetadata metadata;
    addFaceboxes(env, faces, session->image->width, session->image->height, metadata);
    session->setFilteredImage(
        std::make_shared<FilteredImage>(session->image, metadata, "", defaultFilterConfigValue,
                                        DefaultFilterFactory::filterFactory()));
  } catch (const std::bad_alloc&) {
    throwOutOfMemoryError(env, "QuenbyLib preprocess ran out of memory");
  }
}

void applyAutoEnhanceFilter(JNIEnv* env, jobject, jlong handle, jobject outBitmap,
                            jstring filterName, jstring params) {
  const std::shared_ptr<QuenbySession> session = openSessions().find(handle);
  if (session == nullptr) return;
  const std::shared_ptr<FilteredImage> filteredImage = session->filteredImage();
  if (filteredImage == nullptr) {
    pn_printLog(logError, logTag, "applyAutoEnhanceFilter before preprocess");
    return;
  }
  try {
    const Image<RGBA8Pixel>& photo = *session->image;
    Image<RGBA8Pixel> output = session->takeOutput();
    const std::string name = toString(env, filterName);
    const std::string parameters = toString(env, params);
    filterOrCopy(*filteredImage, photo, name, parameters, output);
    copyToBitmap(env, output, outBitmap);
    session->giveOutputBack(std::move(output));
  } catch (const std::bad_alloc&) {
    throwOutOfMemoryError(env, "QuenbyLib real-time filtering ran out of memory");
  }
}

void releaseSession(JNIEnv*, jobject, jlong handle) {
  if (handle != 0) openSessions().release(handle);
}

}  // namespace pelorin::quenby
