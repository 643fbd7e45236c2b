#pragma once

#include <jni.h>

#include <cstdint>

#include "platform/pn_imgproc/stream.h"

namespace pelorin::imgproc {

enum class ColorSpace { RGBA_8888 };

/// JPEG files for the natives. Stateless; std::bad_alloc passes through, and std::system_error when
/// an output cannot be written.
class NativeImageProcessor {
 public:
  /// Turns the JPEG file `in` clockwise into `out`, without loss.
  /// @param rotation  degrees, a multiple of 90, taken modulo 360.
  /// @throws photo::PhotoError for another angle or a damaged file.
  static void rotateJpeg(JNIEnv* env, Stream& in, Stream& out, int rotation);

  /// Decodes the file at `path` (modified UTF-8). A null buffer says that it cannot be read or is
  /// damaged; the log then has the reason.
  /// @param pixels  rows back to back, to be released with `free`.
  /// @param scale   1 or less is full size, otherwise the divisor, rounded down to a power of two,
  ///                at most 8.
  static void decodeJpeg(JNIEnv* env, const char* path, std::uint8_t** pixels, int* width,
                         int* height, ColorSpace colorSpace, int scale);

  /// Encodes width x height pixels into `out`.
  /// @param quality  1 ... 100.
  /// @throws photo::PhotoError when no JPEG file can hold such a picture.
  static void encodeJpeg(JNIEnv* env, const std::uint8_t* pixels, int width, int height,
                         ColorSpace colorSpace, int quality, Stream& out);
};

}  // namespace pelorin::imgproc
