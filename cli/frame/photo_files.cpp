#include "cli/frame/photo_files.h"

#include "cli/frame/file_bytes.h"
#include "cli/frame/interrupt.h"

namespace pelorin::cli {

photo::Photo loadPhoto(const Input& input, photo::OpenOptions options, photo::SparePixels* spare) {
  options.stop = interruptToken();
  return photo::open(readInput(input), options, spare);
}

void savePicture(const std::string& path,
                 const image_processing::Image<image_processing::RGBA8Pixel>& picture, bool raw,
                 int quality, const photo::Metadata& metadata) {
  const auto* pixels = reinterpret_cast<const std::uint8_t*>(picture.data.get());
  if (raw) return writeOutput(path, {pixels, picture.byteSize()});
  writeOutput(path, photo::save(picture, "JPEG", metadata, {quality, interruptToken()}));
}

}  // namespace pelorin::cli
