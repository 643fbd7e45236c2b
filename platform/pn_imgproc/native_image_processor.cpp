#include "platform/pn_imgproc/native_image_processor.h"

#include <exception>
#include <new>

#include "photo/file_io.h"
#include "photo/jpeg/jpeg_codec.h"
#include "platform/pn/log.h"
#include "platform/pn_imgproc/stream_file.h"
#include "platform/pn_imgproc/utf8_path.h"

namespace pelorin::imgproc {

void NativeImageProcessor::rotateJpeg(JNIEnv*, Stream& in, Stream& out, int rotation) {
  out.file_->write(photo::rotateJpeg(in.file_->content(), rotation));
}

void NativeImageProcessor::decodeJpeg(JNIEnv*, const char* path, std::uint8_t** pixels, int* width,
                                      int* height, ColorSpace, int scale) {
  *pixels = nullptr;
  try {
    photo::DecodedPicture picture = photo::decodeJpeg(photo::readFile(utf8Path(path)), scale);
    *width = static_cast<int>(picture.width);
    *height = static_cast<int>(picture.height);
    *pixels = picture.pixels.release();
  } catch (const std::bad_alloc&) {
    throw;
  } catch (const std::exception& error) {
    constexpr int logWarning = 5;
    pn_printLog(logWarning, "PnImgproc", "decodeJpeg: %s", error.what());
  }
}

void NativeImageProcessor::encodeJpeg(JNIEnv*, const std::uint8_t* pixels, int width, int height,
                                      ColorSpace, int quality, Stream& out) {
  out.file_->write(photo::encodeJpeg(pixels, static_cast<std::uint32_t>(width),
                                     static_cast<std::uint32_t>(height), quality));
}

}  // namespace pelorin::imgproc
