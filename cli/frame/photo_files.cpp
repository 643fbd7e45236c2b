#include "cli/frame/photo_files.h"

#include <filesystem>

#include "cli/frame/errors.h"
#include "cli/frame/file_bytes.h"
#include "cli/frame/interrupt.h"
#include "cli/frame/keep_option.h"

namespace fs = std::filesystem;

namespace pelorin::cli {

photo::Photo loadPhoto(const Input& input, photo::OpenOptions options, photo::SparePixels* spare) {
  options.stop = interruptToken();
  return photo::open(readInput(input), options, spare);
}

const photo::Format& outputFormat(const std::string& path, bool raw) {
  if (raw) return photo::rawPixels();
  const photo::Format* named = photo::formatWithExtension(fs::path(path).extension().string());
  return named != nullptr ? *named : *photo::formatNamed("JPEG");
}

void requireFormatOf(const std::string& path, bool raw) {
  std::error_code ignored;
  const std::string extension = fs::path(path).extension().string();
  if (path == "-" || extension.empty() || fs::is_other(fs::status(path, ignored))) return;
  const photo::Format* named = photo::formatWithExtension(extension);
  const bool namesRaw = named == &photo::rawPixels();
  if (named != nullptr && namesRaw == raw) return;
  if (raw) {
    throw UsageError(path + ": raw pixels are no " + extension + " file; name it " +
                     std::string(photo::rawPixels().extensions[0]));
  }
  if (namesRaw) {
    throw UsageError(path + ": raw pixels come of raw pixels (--raw); name it " +
                     photo::pictureExtensions());
  }
  throw UsageError(path + ": " + extension + " is no format that can be written; name it " +
                   photo::pictureExtensions());
}

std::vector<photo::Loss> savePicture(
    const std::string& path, const image_processing::Image<image_processing::RGBA8Pixel>& picture,
    const photo::Metadata& metadata, const SaveChoice& choice) {
  std::vector<photo::Loss> lost;
  const std::vector<std::uint8_t> file =
      photo::save(picture, outputFormat(path, choice.raw), metadata,
                  {choice.quality, interruptToken(), choice.keep}, &lost);
  refuseLosses(lost, choice.strict);
  writeOutput(path, file);
  return lost;
}

}  // namespace pelorin::cli
