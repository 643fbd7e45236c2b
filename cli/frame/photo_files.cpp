#include "cli/frame/photo_files.h"

#include "cli/frame/file_bytes.h"
#include "cli/frame/interrupt.h"
#include "cli/frame/keep_option.h"

namespace pelorin::cli {

photo::Photo loadPhoto(const Input& input, photo::OpenOptions options, photo::SparePixels* spare) {
  options.stop = interruptToken();
  return photo::open(readInput(input), options, spare);
}

std::vector<photo::Loss> savePicture(
    const std::string& path, const image_processing::Image<image_processing::RGBA8Pixel>& picture,
    const photo::Metadata& metadata, const SaveChoice& choice) {
  const auto* pixels = reinterpret_cast<const std::uint8_t*>(picture.data.get());
  std::vector<photo::Loss> lost;
  if (choice.raw) {
    writeOutput(path, {pixels, picture.byteSize()});
    return lost;
  }
  const std::vector<std::uint8_t> file = photo::save(
      picture, "JPEG", metadata, {choice.quality, interruptToken(), choice.keep}, &lost);
  refuseLosses(lost, choice.strict);
  writeOutput(path, file);
  return lost;
}

}  // namespace pelorin::cli
