#include "cli/frame/photo_files.h"

#include <filesystem>
#include <utility>

#include "cli/frame/errors.h"
#include "cli/frame/file_bytes.h"
#include "cli/frame/interrupt.h"
#include "cli/frame/keep_option.h"
#include "cli/frame/limits.h"

namespace fs = std::filesystem;

namespace pelorin::cli {

photo::OpenOptions limited(photo::OpenOptions options) {
  options.limits = limits().decode;
  options.stop = interruptToken();
  return options;
}

photo::Photo loadPhoto(const Input& input, photo::OpenOptions options, Talk& talk,
                       photo::SparePixels* spare) {
  photo::Photo photo = photo::open(readInput(input), limited(std::move(options)), spare);
  tellNotices(input, photo.facts, talk);
  return photo;
}

void tellNotices(const Input& input, const photo::PhotoFacts& facts, Talk& talk) {
  for (const std::string& notice : facts.notices) {
    talk.noteOnce(notice, input.shownName() + ": " + notice + " (others like it are not named)");
  }
}

void addQualityOption(Verb verb, int& quality) {
  verb.option("--quality", quality, photo::lossyFormats() + " quality, 90 unless given")
      .between(1, 100)
      .group("Output");
}

SaveChoice drawing(bool overwrite) {
  return {.unnamed = photo::formatNamed("PNG"),
          .quality = 95,
          .colour = photo::ColourDetail::full,
          .replace = {.mayReplace = overwrite}};
}

const photo::Format& outputFormat(const std::string& path, const SaveChoice& choice) {
  if (choice.raw) return photo::rawPixels();
  const photo::Format* named = photo::formatWithExtension(fs::path(path).extension().string());
  return named != nullptr ? *named : *choice.unnamed;
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
    throw UsageError(path + ": a picture is no " + extension + " file; name it " +
                     photo::pictureExtensions());
  }
  throw UsageError(path + ": " + extension + " is no format that can be written; name it " +
                   photo::pictureExtensions());
}

photo::SaveOptions saveOptions(const SaveChoice& choice) {
  return {.quality = choice.quality,
          .stop = interruptToken(),
          .keep = choice.keep,
          .mark = choice.mark,
          .colour = choice.colour,
          .sampling = choice.sampling};
}

void writePhoto(const std::string& path, const photo::FileView& file,
                const std::vector<photo::Loss>& lost, const SaveChoice& choice) {
  refuseLosses(lost, choice.strict);
  writeOutput(path, file, choice.replace, choice.backup);
}

std::vector<photo::Loss> savePicture(
    const std::string& path, const image_processing::Image<image_processing::RGBA8Pixel>& picture,
    const photo::Metadata& metadata, const SaveChoice& choice) {
  std::vector<photo::Loss> lost;
  const std::vector<std::uint8_t> file =
      photo::save(picture, outputFormat(path, choice), metadata, saveOptions(choice), &lost);
  writePhoto(path, file, lost, choice);
  return lost;
}

}  // namespace pelorin::cli
