#pragma once

#include <optional>
#include <set>
#include <vector>

#include "image_processing/core/image.h"
#include "photo/metadata/chosen_metadata.h"
#include "photo/metadata/jpeg_tail.h"
#include "photo/metadata/loss.h"
#include "photo/metadata/metadata.h"
#include "photo/metadata/thumbnail.h"
#include "photo/picture_size.h"

namespace pelorin::photo {

/// What a file is to keep of the metadata of the photo that it is made of. What goes by choice is
/// not lost.
struct KeepOptions {
  std::optional<std::set<MetadataKind>> only = {};  ///< Beside the colours; else everything.
  bool location = true;
  bool thumbnail = true;
  bool gainMap = true;
};

/// The metadata of a file that is about to be written.
struct KeptMetadata {
  std::vector<MetadataSegment> segments;
  std::vector<PngChunk> chunks;
  std::vector<TailPart> tail;  ///< What is to stand behind the picture.
  std::vector<Loss> lost;      ///< What the photo had and this file has not.
};

/// The metadata of a picture made of a photo, such that it says what the picture is: its size and
/// that it is upright, a thumbnail of it, regions where their contents are, a gain map turned with
/// it, an index and a container of what the file holds. What is unknown stays byte for byte; what
/// can neither be kept nor made true goes and is named in `lost`.
/// @param picture   as it will be written, upright.
/// @param metadata  what `open` gave with it.
/// @throws std::bad_alloc.
KeptMetadata keptMetadata(const image_processing::Image<image_processing::RGBA8Pixel>& picture,
                          const Metadata& metadata, const KeepOptions& options = {});

/// The same for a picture of this size that is written row by row.
/// @param thumbnails  was given every row, after `expectThumbnails`.
KeptMetadata keptMetadata(PictureSize picture, ThumbnailMaker& thumbnails, const Metadata& metadata,
                          const KeepOptions& options = {});

/// Tells a maker, before the first row, which thumbnails `keptMetadata` will want of it.
void expectThumbnails(ThumbnailMaker& thumbnails, PictureSize picture, const Metadata& metadata,
                      const KeepOptions& options = {});

/// Removes the colour profile from among the segments.
void removeColourProfile(std::vector<MetadataSegment>& segments);

/// Appends the kept tail to a JPEG file with the kept segments, and fills in the index of pictures
/// among them.
void appendTail(std::vector<std::uint8_t>& file, const std::vector<TailPart>& tail);

}  // namespace pelorin::photo
