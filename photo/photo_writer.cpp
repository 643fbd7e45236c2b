#include "photo/photo_writer.h"

#include <bit>
#include <cstring>
#include <string>
#include <utility>

#include "photo/metadata/segments.h"

namespace pelorin::photo {

using image_processing::RGBA8Pixel;

bool isOpaque(const RGBA8Pixel* pixels, std::size_t count) {
  std::uint32_t all = ~0u;  // of every channel: a loop without a branch, of which vectors are made
#pragma GCC unroll 8
  for (std::size_t i = 0; i < count; ++i) {
    std::uint32_t pixel;
    std::memcpy(&pixel, pixels + i, sizeof pixel);
    all &= pixel;
  }
  return std::bit_cast<RGBA8Pixel>(all).a == 255;
}

PhotoWriter::PhotoWriter(PictureSize size, const Format& format, bool hasAlpha,
                         const Metadata& metadata, SaveOptions options)
    : size_(size),
      format_(format),
      metadata_(metadata),
      options_(std::move(options)),
      thumbnails_(size),
      writer_(format.writer(size, hasAlpha, options_, metadata)),
      asksAlpha_(hasAlpha && !format.keepsAlpha) {
  expectThumbnails(thumbnails_, size, metadata, options_.keep);
}

void PhotoWriter::write(const RGBA8Pixel* rows, std::uint32_t count) {
  writer_->write(rows, count);
  // Behind the writer, while the rows are near: memory would take longer than the looking.
  thumbnails_.addRows(rows, count);
  if (asksAlpha_ && !isOpaque(rows, std::size_t{count} * size_.width)) {
    losesAlpha_ = true;
    asksAlpha_ = false;
  }
}

std::vector<std::uint8_t> PhotoWriter::finish(std::vector<Loss>* lost) {
  KeptMetadata kept = keptMetadata(size_, thumbnails_, metadata_, options_.keep);
  if (options_.mark) addEditMark(kept.segments, *options_.mark, kept.lost);
  format_.removeForeign(kept);
  if (!writer_->isGrey() && isGreyProfile(kept.segments)) {
    removeColourProfile(kept.segments);
    kept.lost.push_back({"colour profile", "is for grey, and the result is in colour"});
  }
  std::vector<std::uint8_t> file = writer_->finish(kept);
  if (losesAlpha_)
    kept.lost.push_back({"transparency", "a " + std::string(format_.name) + " file has none"});
  if (lost != nullptr) *lost = std::move(kept.lost);
  stopIfAsked(options_.stop);
  return file;
}

}  // namespace pelorin::photo
