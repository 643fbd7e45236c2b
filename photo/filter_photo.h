#pragma once

#include <cstdint>
#include <span>
#include <stop_token>
#include <string>
#include <vector>

#include "image_processing/filters/filter_description.h"
#include "photo/faces.h"
#include "photo/photo.h"

namespace pelorin::photo {

/// What to make of a photo, in the terms of `quenby enhance`.
struct FilterRequest {
  std::string filter;  ///< A name in the registry.
  std::string params;
  std::vector<Face> faces = {};  ///< Beside those the file knows of.
  OpenOptions open = {};
  SaveOptions save = {};
};

/// The filter of this name, when it can do with these parameters.
/// @throws std::invalid_argument that names what is wrong: the filter, or a key that it does not
///         have, misses or cannot read. What else `checkParameters` finds, filters take in silence.
const image_processing::FilterDescription& filterFor(const std::string& name,
                                                     const std::string& params);

/// @throws std::invalid_argument when a side is not finite.
void requireFinite(const std::vector<Face>& faces);

/// Filters a photo in its own pixels, by rows: with hardly any memory beside them. The bytes are
/// those of a session on it.
/// @param filter  a name in the registry.
/// @param faces   beside those that its file knows of.
/// @param scale   how often smaller it was decoded than it is.
/// @throws PhotoError for a face in pixels that lies outside the picture; Stopped; what the filter
///         throws.
void filterInPlace(Photo& photo, const std::string& filter, const std::string& params,
                   const std::vector<Face>& faces, int scale, const std::stop_token& stop = {});

/// The bytes of the file that the command writes for the same options: upright, filtered, with the
/// metadata kept.
/// @param format  of the result; null for that of `file`.
/// @param lost    where to tell what of the metadata is not in the file; may be null.
/// @throws std::invalid_argument that names what is wrong with the request: filter, params, quality,
///         rotation, scale or faces; PhotoError, with Stopped when a stop token says so;
///         std::bad_alloc.
std::vector<std::uint8_t> filterPhoto(std::span<const std::uint8_t> file,
                                      const FilterRequest& request, const Format* format,
                                      std::vector<Loss>* lost = nullptr);

}  // namespace pelorin::photo
