#include "tests/jni/support/picture_files.h"

#include "photo/file_io.h"
#include "photo/jpeg/jpeg_codec.h"

namespace pelorin::test_support {

void writePicture(const std::string& path,
                  const image_processing::Image<image_processing::RGBA8Pixel>& picture) {
  photo::writeFileAtomically(
      path, photo::encodeJpeg(&picture.data.get()->r, picture.width, picture.height, 95));
}

std::vector<std::uint8_t> contentOf(const std::string& path) {
  return photo::readFile(path);
}

}  // namespace pelorin::test_support
