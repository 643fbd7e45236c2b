#include <cstdlib>
#include <memory>
#include <new>
#include <optional>
#include <stdexcept>
#include <string>
#include <system_error>

#include "image_processing/filters/default_filter_factory.h"
#include "jni/add_faceboxes.h"
#include "jni/filter_or_copy.h"
#include "jni/java_string.h"
#include "jni/log.h"
#include "jni/natives.h"
#include "jni/rotated_copy.h"
#include "platform/pn/jni_lookup.h"
#include "platform/pn_imgproc/native_image_processor.h"
#include "platform/pnjni/exceptions.h"

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
using jni::throwCppExceptionIf;

namespace {

constexpr int outputQuality = 90;

void logUnreadable(const char* path) {
  pn_printLog(logError, logTag, "image decoding/scaling failed for %s", path);
}

void rotate(JNIEnv* env, jstring inputPath, jstring copyPath, int rotation) {
  const JavaCharacters input(env, inputPath);
  bool opened = false;
  try {
    Stream in(env, inputPath, "r");
    opened = true;
    Stream out(env, copyPath, "w");
    NativeImageProcessor::rotateJpeg(env, in, out, rotation);
  } catch (const std::bad_alloc&) {
    throw;
  } catch (const std::system_error&) {
    if (!opened) logUnreadable(input.get());  // otherwise the copy cannot be written
    throw;
  } catch (const std::exception&) {
    logUnreadable(input.get());
    throw;
  }
  // Closing may have raised an exception.
  throwCppExceptionIf(env->ExceptionCheck());
}

}  // namespace

jboolean applyAutoEnhanceFilterToJpegFile(JNIEnv* env, jobject, jstring inputPath,
                                          jstring outputPath, jint rotation, jobjectArray faces,
                                          jint decodeScale, jstring filterName, jstring params) {
  if (inputPath == nullptr) throw std::invalid_argument("inputPath is null");
  if (outputPath == nullptr) throw std::invalid_argument("outputPath is null");
  bool decoded = false;
  try {
    const JavaCharacters path(env, rotation != 0 ? outputPath : inputPath);
    std::optional<RotatedCopy> copy;
    if (rotation != 0) {
      copy.emplace(env, outputPath, path.get());
      rotate(env, inputPath, copy->javaPath(), rotation);
    }
    std::uint8_t* pixels = nullptr;
    int width = 0, height = 0;
    NativeImageProcessor::decodeJpeg(env, copy ? copy->path() : path.get(), &pixels, &width,
                                     &height, ColorSpace::RGBA_8888, decodeScale);
    copy.reset();
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

    {
      Stream out(env, outputPath, "w");
      NativeImageProcessor::encodeJpeg(env,
                                       reinterpret_cast<const std::uint8_t*>(output.data.get()),
                                       width, height, ColorSpace::RGBA_8888, outputQuality, out);
    }
    // Closing may have raised an exception.
    return env->ExceptionCheck() ? JNI_FALSE : JNI_TRUE;
  } catch (const std::bad_alloc&) {
    throwOutOfMemoryError(env, "QuenbyLib JPEG filtering ran out of memory");
    return decoded ? JNI_TRUE : JNI_FALSE;
  }
}

}  // namespace pelorin::quenby
