#include "photo/photo_rows.h"

#include <utility>

#include "image_processing/core/picture_rows.h"
#include "photo/photo.h"
#include "photo/turned_image.h"

namespace pelorin::photo {

using image_processing::Image;
using image_processing::PictureSource;
using image_processing::RGBA8Pixel;
using image_processing::RowSource;

/// The rows of a reader; where there is a picture to keep them, they stand there afterwards.
class PhotoRows::Decoded : public RowSource {
 public:
  Decoded(std::unique_ptr<RowReader> reader, std::shared_ptr<const Image<RGBA8Pixel>> kept)
      : reader_(std::move(reader)), kept_(std::move(kept)) {}

  const RGBA8Pixel* next(std::uint32_t count, RGBA8Pixel* room) override {
    RGBA8Pixel* const rows = kept_ != nullptr ? kept_->row(next_) : room;
    reader_->read(rows, count);
    next_ += count;
    return rows;
  }

 private:
  std::unique_ptr<RowReader> reader_;
  std::shared_ptr<const Image<RGBA8Pixel>> kept_;
  std::uint32_t next_ = 0;
};

PhotoRows::PhotoRows(const FileView& file, const OpenOptions& options,
                     const RowResources& resources)
    : file_(file),
      options_(options),
      resources_(resources),
      reader_(openRows(file, options)),
      facts_(reader_->facts()),
      metadata_(reader_->metadata()) {
  if (options.upright)
    metadata_.turn = turnedFurther(uprightTurn(facts_.orientation), options.rotate);
  size_ = turnedSize(reader_->size(), metadata_.turn);
  if (options.faces && !options.raw) faces_ = knownFaces(metadata_, size_);
}

PhotoRows::~PhotoRows() {
  rows_ = nullptr;
  // What is more than this photo's part goes, since a photo elsewhere may wait for it.
  if (kept_ != nullptr && resources_.spare != nullptr && kept_->byteSize() <= resources_.pixels)
    resources_.spare->keep(*kept_);
}

RowSource& PhotoRows::sweep(bool again) {
  rows_ = nullptr;
  const bool isTurned = metadata_.turn != Turn{};
  if (isTurned) picture();
  if (kept_ != nullptr) {
    rows_ = std::make_unique<PictureSource>(*kept_);
    return *rows_;
  }
  const bool fits =
      std::uint64_t{size_.width} * size_.height <= resources_.pixels / sizeof(RGBA8Pixel);
  if (again && (fits || facts_.progressive)) makeRoom();
  rows_ = std::make_unique<Decoded>(takeReader(), kept_);
  return *rows_;
}

const Image<RGBA8Pixel>& PhotoRows::picture() {
  if (kept_ == nullptr) {
    makeRoom();
    readTurned(*takeReader(), metadata_.turn, *kept_, resources_.workers);
  }
  return *kept_;
}

std::unique_ptr<RowReader> PhotoRows::takeReader() {
  return reader_ != nullptr ? std::move(reader_) : openRows(file_, options_);
}

void PhotoRows::makeRoom() {
  const std::uint64_t bytes = std::uint64_t{size_.width} * size_.height * sizeof(RGBA8Pixel);
  SparePixels none;
  SparePixels& spare = resources_.spare != nullptr ? *resources_.spare : none;
  share_.emplace(resources_.budget, bytes, options_.stop);
  kept_ = spare.picture(size_.width, size_.height);
}

}  // namespace pelorin::photo
