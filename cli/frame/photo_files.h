#pragma once

#include <string>
#include <vector>

#include "cli/frame/inputs.h"
#include "photo/photo.h"

namespace pelorin::cli {

/// Reads a photo, decodes it and turns it upright, unless Ctrl-C comes between.
/// @param spare  where the pixels of a decoded one may come from; may be null.
/// @throws what reading and decoding throw, for `explain`; Interrupted on Ctrl-C.
photo::Photo loadPhoto(const Input& input, photo::OpenOptions options,
                       photo::SparePixels* spare = nullptr);

struct SaveChoice {
  bool raw = false;  ///< As raw pixels, else in the format that the name says.
  int quality = 90;
  photo::KeepOptions keep = {};
  bool strict = false;  ///< Fail where metadata would be lost.
};

/// The format of a file called `path`, which says it by its extension: JPEG without one.
const photo::Format& outputFormat(const std::string& path, bool raw);

/// Refuses a name whose extension is no format, or another than what is written; names without an
/// extension, "-" and special files (/dev/null) pass.
/// @param raw  whether raw pixels are written, else a picture.
/// @throws UsageError.
void requireFormatOf(const std::string& path, bool raw);

/// Writes a picture to a file or standard output, in the format of `outputFormat`.
/// @returns what is lost of the metadata.
/// @throws what encoding and writing throw, Interrupted on Ctrl-C; an old file is then as it was.
std::vector<photo::Loss> savePicture(
    const std::string& path, const image_processing::Image<image_processing::RGBA8Pixel>& picture,
    const photo::Metadata& metadata, const SaveChoice& choice);

}  // namespace pelorin::cli
