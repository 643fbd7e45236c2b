#include "platform/pn_imgproc/native_image_processor.h"

// What the natives may ask a device's libpn_imgproc for.

namespace pelorin::imgproc {

class StreamFile {};

Stream::Stream(JNIEnv*, jstring, const char*) {}
Stream::~Stream() {}

void NativeImageProcessor::rotateJpeg(JNIEnv*, Stream&, Stream&, int) {}

void NativeImageProcessor::decodeJpeg(JNIEnv*, const char*, std::uint8_t** pixels, int*, int*,
                                      ColorSpace, int) {
  *pixels = nullptr;
}

void NativeImageProcessor::encodeJpeg(JNIEnv*, const std::uint8_t*, int, int, ColorSpace, int,
                                      Stream&) {}

}  // namespace pelorin::imgproc
