#pragma once

#include <cstdint>
#include <memory>
#include <span>
#include <string_view>
#include <vector>

#include "image_processing/core/image.h"
#include "photo/file_view.h"
#include "photo/format.h"
#include "photo/metadata/known_faces.h"
#include "photo/metadata/metadata.h"
#include "photo/options.h"
#include "photo/photo_error.h"
#include "photo/photo_facts.h"
#include "photo/rows.h"
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

/// Decodes a photo and turns it upright.
/// @param spare  where the pixels of a decoded one may come from; may be null.
/// @throws PhotoError when the bytes are no photo, or damaged, or beyond the limits: never half a
///         picture. Stopped when `options.stop` says so.
Photo open(std::span<const std::uint8_t> file, const OpenOptions& options = {},
           SparePixels* spare = nullptr);

/// What a file says before its picture data, without decoding.
/// @throws PhotoError as `open`.
PhotoFacts readFacts(std::span<const std::uint8_t> file, const DecodeLimits& limits = {});

/// The rows of a photo, for what needs no whole picture; scaled as `options` say and as they are
/// stored, not turned.
/// @param file  outlives the reader.
/// @throws PhotoError as `open`.
std::unique_ptr<RowReader> openRows(const FileView& file, const OpenOptions& options = {});

/// The bytes of a file with this picture.
/// @param format    from the table of formats.
/// @param metadata  what goes with it, as far as the format can hold it.
/// @param lost      where to tell what of the metadata is not in the file; may be null.
/// @throws PhotoError when the format cannot hold such a picture; Stopped.
std::vector<std::uint8_t> save(const image_processing::Image<image_processing::RGBA8Pixel>& picture,
                               const Format& format, const Metadata& metadata = {},
                               const SaveOptions& options = {}, std::vector<Loss>* lost = nullptr);

/// The same, with a name in the table of formats: "JPEG".
/// @throws PhotoError also when there is no such format.
std::vector<std::uint8_t> save(const image_processing::Image<image_processing::RGBA8Pixel>& picture,
                               std::string_view format, const Metadata& metadata = {},
                               const SaveOptions& options = {}, std::vector<Loss>* lost = nullptr);

}  // namespace pelorin::photo
