#include "bindings/java/photo_natives.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <limits>
#include <optional>
#include <span>
#include <stdexcept>

#include "bindings/java/cancellations.h"
#include "bindings/java/java_arrays.h"
#include "bindings/java/photo_errors.h"
#include "image_processing/dupe/cdf_distance.h"
#include "image_processing/dupe/dupe_score.h"
#include "image_processing/quality/niqe.h"
#include "jni/java_string.h"
#include "jni/native_methods.h"
#include "photo/collection/photo_record.h"
#include "photo/collection/photo_score.h"
#include "photo/filter_photo.h"
#include "photo/photo.h"

namespace pelorin::quenby {

using image_processing::GreenCDF;

namespace {

std::vector<photo::Face> facesOf(JNIEnv* env, jfloatArray array) {
  const std::vector<float> sides = floatsOf(env, array);
  if (sides.size() % 4 != 0)
    throw std::invalid_argument("faces: needs left, top, right, bottom of each");
  std::vector<photo::Face> faces;
  for (std::size_t i = 0; i < sides.size(); i += 4)
    faces.push_back({sides[i], sides[i + 1], sides[i + 2], sides[i + 3]});
  return faces;
}

std::optional<photo::ChromaSampling> samplingOf(jint subsampling) {
  switch (subsampling) {
    case 0:
      return std::nullopt;
    case 444:
      return photo::ChromaSampling{1, 1};
    case 422:
      return photo::ChromaSampling{2, 1};
    case 420:
      return photo::ChromaSampling{2, 2};
    default:
      throw std::invalid_argument("subsampling: is none of 444, 422, 420");
  }
}

void tellLosses(JNIEnv* env, const std::vector<photo::Loss>& losses, jobjectArray lost) {
  std::string text;
  for (const photo::Loss& loss : losses) {
    for (std::string part : {loss.what, loss.why}) {
      std::replace(part.begin(), part.end(), '\0', ' ');
      text += part;
      text += '\0';
    }
  }
  const jbyteArray bytes =
      javaArray(env, std::span(reinterpret_cast<const std::uint8_t*>(text.data()), text.size()));
  env->SetObjectArrayElement(lost, 0, bytes);
  env->DeleteLocalRef(bytes);
  jni::throwCppExceptionIf(env->ExceptionCheck() != JNI_FALSE);
}

photo::DecodeLimits limitsOf(jlong maxBytes, jlong maxPixels, jint maxScans, jint maxSegments) {
  if (maxBytes < 0 || maxPixels < 0 || maxScans < 0 || maxSegments < 0) {
    throw std::invalid_argument("limits: are negative");
  }
  photo::DecodeLimits limits;
  if (maxBytes != 0) limits.bytes = static_cast<std::uint64_t>(maxBytes);
  // Who names a number of pixels gets as many, also from a file that is small for them.
  if (maxPixels != 0) {
    limits.pixels = limits.compressedPixels = static_cast<std::uint64_t>(maxPixels);
  }
  if (maxScans != 0) limits.scans = maxScans;
  if (maxSegments != 0) limits.segments = maxSegments;
  return limits;
}

GreenCDF cdfOf(JNIEnv* env, jfloatArray array) {
  const std::vector<float> values = floatsOf(env, array);
  GreenCDF cdf;
  if (values.size() != cdf.size()) throw std::invalid_argument("a green CDF has 256 values");
  std::copy(values.begin(), values.end(), cdf.begin());
  return cdf;
}

}  // namespace

jbyteArray filterBytes(JNIEnv* env, jobject, jbyteArray array, jobject buffer, jint offset,
                       jint length, jint quality, jint subsampling, jint rotation,
                       jfloatArray faces, jint scale, jstring filter, jstring params, jboolean mark,
                       jlong cancel, jobjectArray lost, jlong maxBytes, jlong maxPixels,
                       jint maxScans, jint maxSegments, jboolean png) {
  const std::stop_token stop = cancellations().token(cancel);
  const std::optional<photo::ChromaSampling> sampling = samplingOf(subsampling);
  const photo::DecodeLimits limits = limitsOf(maxBytes, maxPixels, maxScans, maxSegments);
  const photo::FilterRequest request{
      .filter = toString(env, filter),
      .params = toString(env, params),
      .faces = facesOf(env, faces),
      .open = {.scale = scale, .rotate = rotation, .limits = limits, .stop = stop},
      .save = {.quality = quality, .stop = stop, .sampling = sampling},
      .mark = mark != JNI_FALSE};
  const FileBytes file(env, array, buffer, offset, length);
  const photo::FilteredPhoto made = photo::filterPhoto(
      file.bytes(), request, photo::formatNamed(png != JNI_FALSE ? "PNG" : "JPEG"));
  if (lost != nullptr) tellLosses(env, made.lost, lost);
  return javaArray(env, made.file);
}

jfloat niqe(JNIEnv* env, jobject, jbyteArray array, jobject buffer, jint offset, jint length,
            jlong cancel, jlong maxBytes, jlong maxPixels, jint maxScans, jint maxSegments) {
  const photo::DecodeLimits limits = limitsOf(maxBytes, maxPixels, maxScans, maxSegments);
  const FileBytes file(env, array, buffer, offset, length);
  return photo::scoreOf(file.bytes(), cancellations().token(cancel), {}, limits);
}

jfloatArray niqeMeanFeatures(JNIEnv* env, jobject, jbyteArray array, jobject buffer, jint offset,
                             jint length, jlong cancel, jlong maxBytes, jlong maxPixels,
                             jint maxScans, jint maxSegments) {
  const photo::DecodeLimits limits = limitsOf(maxBytes, maxPixels, maxScans, maxSegments);
  const FileBytes file(env, array, buffer, offset, length);
  photo::PhotoRows photo(file.bytes(),
                         {.faces = false, .limits = limits, .stop = cancellations().token(cancel)});
  const auto [width, height] = photo.size();
  image_processing::RowSource& rows = photo.sweep(/*again=*/false);
  return javaArray(env, image_processing::analyzeNiqe(width, height, rows).meanFeatures);
}

jfloatArray greenCdf(JNIEnv* env, jobject, jbyteArray array, jobject buffer, jint offset,
                     jint length, jlong cancel, jlong maxBytes, jlong maxPixels, jint maxScans,
                     jint maxSegments) {
  const photo::DecodeLimits limits = limitsOf(maxBytes, maxPixels, maxScans, maxSegments);
  const FileBytes file(env, array, buffer, offset, length);
  return javaArray(env, photo::readPhotoRecord(file.bytes(), photo::automaticScale,
                                               cancellations().token(cancel), limits)
                            .cdf.unpacked());
}

jdoubleArray facts(JNIEnv* env, jobject, jbyteArray array, jobject buffer, jint offset, jint length,
                   jlong maxBytes, jlong maxPixels, jint maxScans, jint maxSegments) {
  const photo::DecodeLimits limits = limitsOf(maxBytes, maxPixels, maxScans, maxSegments);
  const FileBytes file(env, array, buffer, offset, length);
  const photo::PhotoFacts facts = photo::readFacts(file.bytes(), limits);
  constexpr double unknown = std::numeric_limits<double>::quiet_NaN();
  std::array<double, 5> values = {double(facts.width), double(facts.height),
                                  double(facts.orientation), unknown, unknown};
  if (facts.captureTime) {
    const photo::ShotTime time = photo::shotTime(*facts.captureTime);
    values[3] = time.wallClock;
    values[4] = time.utc.value_or(unknown);
  }
  return javaArray(env, values);
}

jfloat distance(JNIEnv* env, jobject, jfloatArray a, jfloatArray b) {
  return image_processing::exposureInvariantCDFDistance(cdfOf(env, a), cdfOf(env, b));
}

jfloat score(JNIEnv*, jobject, jfloat distance, jdouble seconds, jboolean sameOrientation) {
  return image_processing::dupeScoreOfDistance(distance, static_cast<float>(std::fabs(seconds)),
                                               sameOrientation != JNI_FALSE);
}

jdouble window(JNIEnv*, jobject, jfloat threshold, jboolean sameOrientation) {
  return image_processing::longestDupeTimeDifference(threshold, sameOrientation != JNI_FALSE);
}

jstring version(JNIEnv* env, jobject) {
  return env->NewStringUTF(PELORIN_VERSION);
}

jlong newCancel(JNIEnv*, jobject) {
  return cancellations().open();
}

void cancel(JNIEnv*, jobject, jlong handle) {
  cancellations().cancel(handle);
}

void freeCancel(JNIEnv*, jobject, jlong handle) {
  cancellations().close(handle);
}

void registerPhotoNatives() {
  const JNINativeMethod methods[] = {
      nativeMethod(
          "filter",
          "([BLjava/nio/ByteBuffer;IIIII[FILjava/lang/String;Ljava/lang/String;ZJ[[BJJIIZ)[B",
          photoNative<&filterBytes>()),
      nativeMethod("niqe", "([BLjava/nio/ByteBuffer;IIJJJII)F", photoNative<&niqe>()),
      nativeMethod("niqeFeatures", "([BLjava/nio/ByteBuffer;IIJJJII)[F",
                   photoNative<&niqeMeanFeatures>()),
      nativeMethod("greenCdf", "([BLjava/nio/ByteBuffer;IIJJJII)[F", photoNative<&greenCdf>()),
      nativeMethod("facts", "([BLjava/nio/ByteBuffer;IIJJII)[D", photoNative<&facts>()),
      nativeMethod("distance", "([F[F)F", photoNative<&distance>()),
      nativeMethod("score", "(FDZ)F", photoNative<&score>()),
      nativeMethod("window", "(FZ)D", photoNative<&window>()),
      nativeMethod("version", "()Ljava/lang/String;", photoNative<&version>()),
      nativeMethod("newCancel", "()J", photoNative<&newCancel>()),
      nativeMethod("cancel", "(J)V", photoNative<&cancel>()),
      nativeMethod("freeCancel", "(J)V", photoNative<&freeCancel>()),
  };
  registerNatives("com/pelorin/photos/quenby/autoenhance/PhotoBytes", methods);
}

}  // namespace pelorin::quenby
