#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "image_processing/filters/filter_description.h"
#include "photo/faces.h"
#include "photo/photo.h"
#include "photo/photo_rows.h"

namespace pelorin::photo {

/// What to make of a photo, in the terms of `quenby enhance`.
struct FilterRequest {
  std::string filter;  ///< A name in the registry.
  std::string params;
  std::vector<Face> faces = {};  ///< Beside those the file knows of.
  OpenOptions open = {};
  SaveOptions save = {};
  bool mark = true;  ///< The file tells of it, unless `save` has another mark.
};

/// The mark of an edit by this library, which states no time: of equal parameters the same,
/// however they are written.
EditMark markOf(const std::string& filter, const std::string& params);

/// The last edit that a photo tells of with this filter, or with one that users see under the same
/// name; null without one. Lives as long as the facts.
const EditMark* earlierEdit(const PhotoFacts& facts,
                            const image_processing::FilterDescription& filter);

/// The filter of this name, when it can do with these parameters.
/// @throws std::invalid_argument that names what is wrong: the filter, or a key that it does not
///         have, misses or cannot read. What else `checkParameters` finds, filters take in silence.
const image_processing::FilterDescription& filterFor(const std::string& name,
                                                     const std::string& params);

/// @throws std::invalid_argument when a side is not finite.
void requireFinite(const std::vector<Face>& faces);

/// A filtered photo as a file, and what is to say of it.
struct FilteredPhoto {
  std::vector<std::uint8_t> file;  ///< Behind it belongs what an overflow has.
  PictureSize size;
  PhotoFacts facts;             ///< Of the photo that it is made of.
  std::vector<Loss> lost = {};  ///< What of the metadata is not in the file.
};

/// Filters a photo into the file that the command writes for the same options: upright, filtered,
/// with the metadata kept. It goes by rows, with hardly any memory beside what `resources` allows for
/// pixels and the bytes of the two files, and has the bytes of the filter on the whole picture.
/// @param format  of the result; null for that of `file`.
/// @throws std::invalid_argument that names what is wrong with the request: filter, params, quality,
///         rotation, scale or faces; PhotoError as `open` and `save`, and for a face in pixels that
///         lies outside the picture; Stopped when a stop token says so; std::bad_alloc; what reading
///         the rest of `file` and writing into `request.save.overflow` throw.
FilteredPhoto filterPhoto(const FileView& file, const FilterRequest& request,
                          const Format* format = nullptr, const RowResources& resources = {});

}  // namespace pelorin::photo
