#include <cstdlib>
#include <memory>
#include <new>
#include <stdexcept>
#include <string>

#include "image_processing/filters/default_filter_factory.h"
#include "jni/add_faceboxes.h"
#include "jni/filter_or_copy.h"
#include "jni/java_string.h"
#include "jni/log.h"
#include "jni/natives.h"
#include "platform/pn/jni_lookup.h"
#include "platform/pn_imgproc/native_image_processor.h"

namespace pelorin::quenby {

using image_processing::defaultFilterConfigValue;
using image_processing::DefaultFilterFactory;
using image_processing::FilteredImage;
using image_processing::Image;
using image_processing::ImageMetadata;
using image_processing::RGBA8Pixel;
using imgproc::ColorSpace;
using imgproc::NativeImageProcessor;
using imgproc::Stream;

namespace {

constexpr int outputQuality = 90;

void logUnreadable(const char* path) {
  pn_printLog(logError, logTag, "image decoding/scaling failed for %s", path);
}

void rotate(JNIEnv* env, jstring inputPath, jstring outputPath, int rotation) {
  const JavaCharacters path(env, inputPath);
  Stream out(env, outputPath, "w");
  try {
    Stream in(env, inputPath, "r");
    NativeImageProcessor::rotateJpeg(env, in, out, rotation);
  } catch (const std::bad_alloc&) {
    throw;
  } catch (const std::exception&) {
    logUnreadable(path.get());
    throw;
  }
  out.close();
}

}  // namespace

jboolean applyAutoEnhanceFilterToJpegFile(JNIEnv* env, jobject, jstring inputPath,
                                          jstring outputPath, jint rotation, jobjectArray faces,
                                          jint decodeScale, jstring filterName, jstring params) {
  if (inputPath == nullptr) throw std::invalid_argument("inputPath is null");
  if (outputPath == nullptr) throw std::invalid_argument("outputPath is null");
  bool decoded = false;
  try {
    if (rotation != 0) rotate(env, inputPath, outputPath, rotation);
    const JavaCharacters path(env, rotation != 0 ? outputPath : inputPath);
    std::uint8_t* pixels = nullptr;
    int width = 0, height = 0;
    NativeImageProcessor::decodeJpeg(env, path.get(), &pixels, &width, &height,
                                     ColorSpace::RGBA_8888, decodeScale);
    if (pixels == nullptr) {
      logUnreadable(path.get());
      return JNI_FALSE;
    }
    decoded = true;
    const std::shared_ptr<RGBA8Pixel> buffer(reinterpret_cast<RGBA8Pixel*>(pixels), free);
    if (env->ExceptionCheck()) return JNI_FALSE;

    const std::string name = toString(env, filterName);
    const std::string parameters = toString(env, params);
    pn_printLog(logDebug, logTag, "applyToJpegFile: %s [%dx%d:%d] %s %s", path.get(), width, height,
                rotation, name.c_str(), parameters.c_str());
    auto image = std::make_shared<Image<RGBA8Pixel>>(width, height, buffer);
    ImageMetadata metadata;
    addFaceboxes(env, faces, image->width, image->height, metadata);
    FilteredImage filteredImage(image, metadata, "", defaultFilterConfigValue,
                                DefaultFilterFactory::filterFactory());
    Image<RGBA8Pixel> output(image->width, image->height);
    filterOrCopy(filteredImage, *image, name, parameters, output);

    Stream out(env, outputPath, "w");
    NativeImageProcessor::encodeJpeg(env, reinterpret_cast<const std::uint8_t*>(output.data.get()),
                                     width, height, ColorSpace::RGBA_8888, outputQuality, out);
    out.close();
    return JNI_TRUE;
  } catch (const std::bad_alloc&) {
    throwOutOfMemoryError(env, "QuenbyLib JPEG filtering ran out of memory");
    return decoded ? JNI_TRUE : JNI_FALSE;
  }
}

}  // namespace pelorin::quenby
