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
  bool raw = false;  ///< As raw pixels, else as JPEG.
  int quality = 90;
  photo::KeepOptions keep = {};
  bool strict = false;  ///< Fail where metadata would be lost.
};

/// Writes a picture to a file or standard output.
/// @returns what is lost of the metadata.
/// @throws what encoding and writing throw, Interrupted on Ctrl-C; an old file is then as it was.
std::vector<photo::Loss> savePicture(
    const std::string& path, const image_processing::Image<image_processing::RGBA8Pixel>& picture,
    const photo::Metadata& metadata, const SaveChoice& choice);

}  // namespace pelorin::cli
