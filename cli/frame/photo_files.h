#pragma once

#include <string>

#include "cli/frame/inputs.h"
#include "photo/photo.h"

namespace pelorin::cli {

/// Reads a photo, decodes it and turns it upright, unless Ctrl-C comes between.
/// @param spare  where the pixels of a decoded one may come from; may be null.
/// @throws what reading and decoding throw, for `explain`; Interrupted on Ctrl-C.
photo::Photo loadPhoto(const Input& input, photo::OpenOptions options,
                       photo::SparePixels* spare = nullptr);

/// Writes a picture to a file or standard output, as JPEG or, with `raw`, as raw pixels.
/// @throws what encoding and writing throw, Interrupted on Ctrl-C; an old file is then as it was.
void savePicture(const std::string& path,
                 const image_processing::Image<image_processing::RGBA8Pixel>& picture, bool raw,
                 int quality, const photo::Metadata& metadata);

}  // namespace pelorin::cli
