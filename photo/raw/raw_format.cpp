#include "photo/raw/raw_format.h"

#include <cstring>
#include <string>
#include <utility>

#include "image_processing/core/checked_size.h"
#include "photo/photo_error.h"

namespace pelorin::photo {
namespace {

using image_processing::RGBA8Pixel;

/// Packed RGBA bytes, rows back to back.
class RawReader : public RowReader {
 public:
  RawReader(std::span<const std::uint8_t> file, const OpenOptions& options) : rest_(file) {
    if (!options.raw) {
      throw PhotoError(PhotoError::Kind::invalidRequest, "raw pixels need their size to be said");
    }
    size_ = *options.raw;
    facts_.format = rawFormat.name;
    facts_.width = size_.width;
    facts_.height = size_.height;
    facts_.channels = 4;
    facts_.hasAlpha = true;
    const std::uint64_t needed =
        image_processing::checkedProduct(size_.width, size_.height, sizeof(RGBA8Pixel));
    if (file.size() == needed) return;
    throw PhotoError(PhotoError::Kind::invalidRequest,
                     "holds " + std::to_string(file.size()) + " bytes, but " +
                         std::to_string(size_.width) + "x" + std::to_string(size_.height) +
                         " raw pixels are " + std::to_string(needed) + " bytes");
  }

  void read(RGBA8Pixel* rows, std::uint32_t count) override {
    const std::size_t bytes = std::size_t{size_.width} * count * sizeof(RGBA8Pixel);
    std::memcpy(rows, rest_.data(), bytes);
    rest_ = rest_.subspan(bytes);
  }

 private:
  std::span<const std::uint8_t> rest_;
};

class RawWriter : public RowWriter {
 public:
  explicit RawWriter(PictureSize size) : width_(size.width) {
    file_.reserve(image_processing::checkedProduct(size.width, size.height, sizeof(RGBA8Pixel)));
  }

  void write(const RGBA8Pixel* rows, std::uint32_t count) override {
    const auto* bytes = reinterpret_cast<const std::uint8_t*>(rows);
    file_.insert(file_.end(), bytes, bytes + std::size_t{width_} * count * sizeof(RGBA8Pixel));
  }

  std::vector<std::uint8_t> finish(const KeptMetadata&) override { return std::move(file_); }

 private:
  std::uint32_t width_;
  std::vector<std::uint8_t> file_;
};

constexpr std::string_view extensions[] = {".rgba"};

}  // namespace

constinit const Format rawFormat = {
    .name = "raw pixels",
    .extensions = extensions,
    .scalesWhileDecoding = false,
    .keepsAlpha = true,
    .losesDetail = false,
    .recognises = [](std::span<const std::uint8_t>) { return false; },
    .mayBePart = [](std::span<const std::uint8_t>) { return false; },
    .reader = [](const FileView& file, const OpenOptions& options) -> std::unique_ptr<RowReader> {
      return std::make_unique<RawReader>(file.bytes, options);
    },
    .removeForeign = [](KeptMetadata& kept) { kept = {}; },  // nothing but pixels is what they are
    .writer = [](PictureSize size, bool, const SaveOptions&, const Metadata&)
        -> std::unique_ptr<RowWriter> { return std::make_unique<RawWriter>(size); },
};

}  // namespace pelorin::photo
