#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "photo/jpeg/jpeg_coding.h"
#include "photo/jpeg/metadata_segment.h"
#include "photo/picture_size.h"
#include "photo/turn.h"

namespace pelorin::photo {

/// A part of a PNG file beside its picture.
struct PngChunk {
  std::string type;  ///< Four letters: "tEXt".
  std::vector<std::uint8_t> data;
};

/// What a photo says beside its pixels, as its file has it.
struct Metadata {
  /// EXIF, XMP, colour profile and the rest, as a JPEG file has them, whatever the file was; in its
  /// order. One of a PNG file may be longer than a JPEG file allows.
  std::vector<MetadataSegment> segments;
  /// What only a PNG file can hold: texts, resolution, colour space.
  std::vector<PngChunk> chunks = {};
  /// What stands behind the picture in the file: gain map, previews, video.
  std::vector<std::uint8_t> tail = {};
  // What all of it was written for, and how the decoded picture differs from that.
  PictureSize storedSize = {};
  int orientation = 1;  ///< EXIF, 1 ... 8.
  Turn turn = {};       ///< From the stored picture to the decoded one.
  /// Of a JPEG file; another one that is made of the photo is coded likewise.
  std::optional<JpegCoding> coding = {};
};

}  // namespace pelorin::photo
