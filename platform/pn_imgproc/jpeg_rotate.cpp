#include <turbojpeg.h>

#include <memory>
#include <new>
#include <string>
#include <type_traits>

#include "platform/pn_imgproc/jpeg_codec.h"
#include "platform/pn_imgproc/jpeg_limits.h"
#include "platform/pn_imgproc/libjpeg_reader.h"

namespace pelorin::imgproc {
namespace {

struct DestroyTransformer {
  void operator()(void* handle) const { tjDestroy(handle); }
};
using Transformer = std::unique_ptr<std::remove_pointer_t<tjhandle>, DestroyTransformer>;

struct FreeOutput {
  void operator()(unsigned char* bytes) const { tjFree(bytes); }
};

TJXOP operationFor(int degrees) {
  switch ((degrees % 360 + 360) % 360) {
    case 0:
      return TJXOP_NONE;
    case 90:
      return TJXOP_ROT90;
    case 180:
      return TJXOP_ROT180;
    case 270:
      return TJXOP_ROT270;
    default:
      throw JpegError("a JPEG file turns by multiples of 90 degrees, not by " +
                      std::to_string(degrees));
  }
}

// Decodes the blocks, without making pixels of them, to see that they are all there.
void checkPictureData(std::span<const std::uint8_t> file) {
  LibjpegReader reader(file);
  reader.readHeader();
  reader.run([&] { jpeg_read_coefficients(&reader.codec()); });
  reader.checkEveryChannelCame();
}

}  // namespace

std::vector<std::uint8_t> rotateJpeg(std::span<const std::uint8_t> file, int degrees,
                                     const DecodeLimits& limits) {
  tjtransform transform = {};
  transform.op = operationFor(degrees);
  transform.options = TJXOPT_TRIM;
  {
    LibjpegReader reader(file);
    reader.readHeader();
    checkLimits(reader, limits);
    if (reader.codec().progressive_mode) transform.options |= TJXOPT_PROGRESSIVE;
  }
  if (transform.op == TJXOP_NONE) {
    checkPictureData(file);
    return {file.begin(), file.end()};
  }

  const Transformer transformer(tjInitTransform());
  if (transformer == nullptr) throw std::bad_alloc();
  unsigned char* output = nullptr;
  unsigned long size = 0;
  const int result = tjTransform(transformer.get(), file.data(), file.size(), /*n=*/1, &output,
                                 &size, &transform, /*flags=*/0);
  const std::unique_ptr<unsigned char, FreeOutput> owner(output);
  if (result != 0) {
    // TurboJPEG does not tell which warnings there were: look again with our own eyes.
    checkPictureData(file);
    if (tjGetErrorCode(transformer.get()) != TJERR_WARNING) {
      throw JpegError(std::string("cannot be turned without loss: ") +
                      tjGetErrorStr2(transformer.get()));
    }
  }
  return {output, output + size};
}

}  // namespace pelorin::imgproc
