#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <vector>

#include "image_processing/core/image.h"
#include "image_processing/core/rows.h"
#include "image_processing/core/workers.h"
#include "photo/file_view.h"
#include "photo/metadata/known_faces.h"
#include "photo/options.h"
#include "photo/pixel_budget.h"
#include "photo/rows.h"
#include "photo/spare_pixels.h"

namespace pelorin::photo {

/// What going over a photo may use; nothing of it changes a pixel.
struct RowResources {
  /// Bytes of decoded pixels, 4 each, that are kept for going over them again. A photo with more is
  /// decoded again instead. One that is turned or whose rows come in several passes is kept in any
  /// case.
  std::uint64_t pixels = std::uint64_t{128} << 20;
  PixelBudget* budget = nullptr;  ///< That kept pixels are part of; may be null.
  SparePixels* spare = nullptr;   ///< Where kept pixels may come from and go; may be null.
  /// Share the work: decoding, filtering and encoding go on at the same time. Null for none.
  image_processing::Workers* workers = nullptr;
  std::uint32_t bandHeight = 0;  ///< Rows that are filtered at a time; 0 for as many as go fast.
};

/// The rows of a photo, upright, to go over once or several times. For one thread.
class PhotoRows {
 public:
  /// @param file  outlives this, as do the resources.
  /// @throws PhotoError as `open`; Stopped; what reading the rest of a file throws.
  PhotoRows(const FileView& file, const OpenOptions& options, const RowResources& resources = {});
  ~PhotoRows();
  PhotoRows(const PhotoRows&) = delete;
  PhotoRows& operator=(const PhotoRows&) = delete;

  const PhotoFacts& facts() const { return facts_; }
  const Metadata& metadata() const { return metadata_; }          ///< For a file made of it.
  const std::vector<KnownFace>& faces() const { return faces_; }  ///< That the file knows of.
  PictureSize size() const { return size_; }                      ///< Scaled and upright.

  /// All rows, from the first one on. What came before must have been read to the end.
  /// @param again  whether they will be gone over once more.
  /// @returns what this owns, until the next call. It throws what `RowReader::read` throws.
  /// @throws as the constructor; std::bad_alloc.
  image_processing::RowSource& sweep(bool again);

  /// The whole picture, kept from now on. @throws as `sweep`.
  const image_processing::Image<image_processing::RGBA8Pixel>& picture();

 private:
  class Decoded;
  std::unique_ptr<RowReader> takeReader();
  void makeRoom();

  FileView file_;
  const OpenOptions options_;
  const RowResources resources_;
  std::unique_ptr<RowReader> reader_;  // of which no row was read yet; null once one is in use
  PhotoFacts facts_;
  Metadata metadata_;
  std::vector<KnownFace> faces_;
  PictureSize size_;
  std::optional<PixelBudget::Share> share_;
  std::shared_ptr<image_processing::Image<image_processing::RGBA8Pixel>> kept_;
  std::unique_ptr<image_processing::RowSource> rows_;
};

}  // namespace pelorin::photo
