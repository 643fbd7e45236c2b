#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <stop_token>
#include <string_view>
#include <vector>

#include "image_processing/core/image.h"
#include "photo/decode_limits.h"
#include "photo/metadata/kept_metadata.h"
#include "photo/metadata/known_faces.h"
#include "photo/metadata/metadata.h"
#include "photo/photo_error.h"
#include "photo/photo_facts.h"
#include "photo/picture_size.h"
#include "photo/spare_pixels.h"

namespace pelorin::photo {

// Whole photos: bytes in, bytes out. Nothing here keeps state, prints or looks at the process, so
// any thread may call. Errors are PhotoError and std::bad_alloc.

/// A decoded picture, upright, and what its file says.
struct Photo {
  std::shared_ptr<image_processing::Image<image_processing::RGBA8Pixel>> image;
  PhotoFacts facts;
  Metadata metadata;             ///< For a file made of it.
  std::vector<KnownFace> faces;  ///< That the file knows of.
};

struct OpenOptions {
  int scale = 1;                        ///< 1, 2, 4 or 8: what its sides are divided by.
  int rotate = 0;                       ///< Degrees clockwise beyond upright, a multiple of 90.
  bool upright = true;                  ///< Else the picture is as it is stored, and `rotate` idle.
  std::optional<PictureSize> raw = {};  ///< The bytes are raw pixels of this size.
  bool faces = true;                    ///< Read those that the file knows of.
  DecodeLimits limits = {};
  std::stop_token stop = {};  ///< Asked between steps; the default never stops.
};

/// Decodes a photo and turns it upright.
/// @param spare  where the pixels of a decoded one may come from; may be null.
/// @throws PhotoError when the bytes are no photo, or damaged, or beyond the limits: never half a
///         picture. Stopped when `options.stop` says so.
Photo open(std::span<const std::uint8_t> file, const OpenOptions& options = {},
           SparePixels* spare = nullptr);

/// What a file says before its picture data, without decoding.
/// @throws PhotoError as `open`.
PhotoFacts readFacts(std::span<const std::uint8_t> file);

struct SaveOptions {
  int quality = 90;           ///< 1 ... 100, for formats that lose something.
  std::stop_token stop = {};  ///< Asked between steps; the default never stops.
  KeepOptions keep = {};      ///< Of the metadata.
};

/// The bytes of a file with this picture.
/// @param format    a name in the table of formats: "JPEG".
/// @param metadata  what goes with it, as far as the format can hold it.
/// @param lost      where to tell what of the metadata is not in the file; may be null.
/// @throws PhotoError when the format cannot hold such a picture, or is none; Stopped.
std::vector<std::uint8_t> save(const image_processing::Image<image_processing::RGBA8Pixel>& picture,
                               std::string_view format, const Metadata& metadata = {},
                               const SaveOptions& options = {}, std::vector<Loss>* lost = nullptr);

}  // namespace pelorin::photo
