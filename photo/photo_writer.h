#pragma once

#include <cstdint>
#include <memory>
#include <vector>

#include "photo/format.h"
#include "photo/metadata/kept_metadata.h"
#include "photo/metadata/metadata.h"
#include "photo/metadata/thumbnail.h"
#include "photo/options.h"
#include "photo/rows.h"

namespace pelorin::photo {

/// Whether no pixel lets anything through.
bool isOpaque(const image_processing::RGBA8Pixel* pixels, std::size_t count);

/// A file of a picture that comes row by row, with the metadata that goes with it: `save` by rows.
/// For one thread.
class PhotoWriter {
 public:
  /// @param hasAlpha  whether any pixel is not opaque; where the format does not keep that, whether one
  ///                  may be, to tell the loss.
  /// @param metadata  outlives this.
  /// @throws PhotoError when the format cannot hold such a picture; std::bad_alloc.
  PhotoWriter(PictureSize size, const Format& format, bool hasAlpha, const Metadata& metadata,
              SaveOptions options);

  /// The next rows, back to back. @throws Stopped; std::bad_alloc.
  void write(const image_processing::RGBA8Pixel* rows, std::uint32_t count);

  /// The file, once, after the last row.
  /// @param lost  where to tell what of the metadata is not in the file; may be null.
  /// @throws Stopped; PhotoError; std::bad_alloc.
  std::vector<std::uint8_t> finish(std::vector<Loss>* lost);

 private:
  PictureSize size_;
  const Format& format_;
  const Metadata& metadata_;
  SaveOptions options_;
  ThumbnailMaker thumbnails_;
  std::unique_ptr<RowWriter> writer_;
  bool asksAlpha_;
  bool losesAlpha_ = false;
};

}  // namespace pelorin::photo
