#pragma once

#include <cstdint>
#include <vector>

#include "image_processing/core/image.h"
#include "photo/metadata/kept_metadata.h"
#include "photo/metadata/metadata.h"
#include "photo/photo_facts.h"
#include "photo/picture_size.h"

namespace pelorin::photo {

/// A photo whose rows come from top to bottom, as they are stored and not turned. What its file
/// says is known before the first. For one thread; the file's bytes outlive it.
class RowReader {
 public:
  virtual ~RowReader() = default;

  const PhotoFacts& facts() const { return facts_; }
  const Metadata& metadata() const { return metadata_; }  ///< What an upright copy keeps.
  PictureSize size() const { return size_; }              ///< Of its rows: scaled, not turned.

  /// Decodes the next `count` rows into memory of the caller's, back to back. Whoever reads all
  /// rows at once has the fewest copies.
  /// @param count  no more than are left.
  /// @throws PhotoError when the file turns out to be damaged, at the last row at the latest: until
  ///         then rows may belong to a photo that has no end. Stopped.
  virtual void read(image_processing::RGBA8Pixel* rows, std::uint32_t count) = 0;

 protected:
  PhotoFacts facts_;
  Metadata metadata_;
  PictureSize size_ = {0, 0};
};

/// A file that is made row by row. For one thread.
class RowWriter {
 public:
  virtual ~RowWriter() = default;

  /// Takes the next `count` rows, back to back; no more than the picture has.
  /// @throws Stopped, and std::bad_alloc.
  virtual void write(const image_processing::RGBA8Pixel* rows, std::uint32_t count) = 0;

  /// After the last row: whether the file has but one channel.
  virtual bool isGrey() const { return false; }

  /// The whole file, once, after the last row.
  /// @param kept  what goes with the picture, as `Format::removeForeign` left it. It comes last,
  ///              since some of it is made of the rows.
  /// @throws PhotoError for what no file of the format can hold.
  virtual std::vector<std::uint8_t> finish(const KeptMetadata& kept) = 0;
};

}  // namespace pelorin::photo
