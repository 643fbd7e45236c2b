#include "photo/metadata/thumbnail.h"

#include <algorithm>

#include "photo/area_average.h"
#include "photo/jpeg/jpeg_codec.h"

namespace pelorin::photo {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;

// Four lines of those that a new pixel covers tell its colour.
constexpr std::uint32_t linesForEach = 4;

// The average of some lines of whole pixels around each new one: for pictures that have as many for
// each.
class AverageOfLines {
 public:
  AverageOfLines(PictureSize picture, PictureSize size)
      : picture_(picture),
        result_(size.width, size.height),
        sums_(std::size_t{picture.width} * 4) {}

  void addRow(const RGBA8Pixel* row) {
    if (nextRow_++ != lineToAdd()) return;
    const auto* const samples = reinterpret_cast<const std::uint8_t*>(row);
    for (std::size_t x = 0; x < sums_.size(); ++x)
      sums_[x] = static_cast<std::uint16_t>(sums_[x] + samples[x]);
    if (++added_ == linesForEach) finishRow();
  }

  const Image<RGBA8Pixel>& result() const { return result_; }

 private:
  std::uint64_t lineToAdd() const {
    const std::uint64_t top = y_ * picture_.height / result_.height;
    const std::uint64_t bottom = (y_ + 1) * picture_.height / result_.height;
    return top + (2 * added_ + 1) * (bottom - top) / (2 * linesForEach);
  }

  void finishRow() {
    RGBA8Pixel* const made = result_.row(static_cast<std::uint32_t>(y_));
    for (std::uint32_t x = 0; x < result_.width; ++x) {
      const std::uint64_t left = std::uint64_t{x} * picture_.width / result_.width;
      const std::uint64_t right = std::uint64_t{x + 1} * picture_.width / result_.width;
      std::uint64_t red = 0, green = 0, blue = 0;
      for (std::uint64_t column = left; column < right; ++column) {
        red += sums_[4 * column];
        green += sums_[4 * column + 1];
        blue += sums_[4 * column + 2];
      }
      const std::uint64_t count = (right - left) * linesForEach;
      const auto share = [&](std::uint64_t sum) {
        return static_cast<std::uint8_t>((sum + count / 2) / count);
      };
      made[x] = {share(red), share(green), share(blue), 255};
    }
    std::fill(sums_.begin(), sums_.end(), std::uint16_t{0});
    added_ = 0;
    ++y_;
  }

  PictureSize picture_;
  Image<RGBA8Pixel> result_;
  std::vector<std::uint16_t> sums_;
  std::uint64_t nextRow_ = 0, y_ = 0, added_ = 0;
};

bool isMuchLarger(PictureSize picture, PictureSize size) {
  return picture.width / size.width >= linesForEach && picture.height / size.height >= linesForEach;
}

// The encoder's JFIF segment stands behind the two bytes of the start mark.
void removeJfif(std::vector<std::uint8_t>& file) {
  if (file.size() > 6 && file[2] == 0xFF && file[3] == 0xE0) {
    const std::ptrdiff_t length = file[4] << 8 | file[5];
    file.erase(file.begin() + 2, file.begin() + 4 + length);
  }
}

}  // namespace

/// The picture at the size of one thumbnail.
class ThumbnailMaker::Reduction {
 public:
  Reduction(PictureSize picture, PictureSize reduced) : size(reduced) {
    if (isMuchLarger(picture, reduced)) {
      lines_.emplace(picture, reduced);
    } else {
      areas_.emplace(picture, reduced);
    }
  }

  void addRow(const RGBA8Pixel* row) {
    if (lines_) {
      lines_->addRow(row);
    } else {
      areas_->addRow(row);
    }
  }

  const Image<RGBA8Pixel>& result() const { return lines_ ? lines_->result() : areas_->result(); }

  const PictureSize size;

 private:
  std::optional<AverageOfLines> lines_;
  std::optional<AreaAverage> areas_;
};

ThumbnailMaker::ThumbnailMaker(const Picture& picture)
    : whole_{picture.width, picture.height}, picture_(&picture) {}

ThumbnailMaker::ThumbnailMaker(PictureSize size) : whole_(size) {}

ThumbnailMaker::~ThumbnailMaker() = default;

void ThumbnailMaker::addRows(const RGBA8Pixel* rows, std::uint32_t count) {
  rows_ += count;
  for (const auto& reduction : reductions_) {
    for (std::uint32_t y = 0; y < count; ++y)
      reduction->addRow(rows + std::size_t{y} * whole_.width);
  }
}

std::optional<Thumbnail> ThumbnailMaker::make(std::uint32_t longerSide, std::size_t room) {
  const PictureSize size = fitWithin(whole_, {longerSide, longerSide});
  const auto known = std::find_if(reductions_.begin(), reductions_.end(),
                                  [&](const auto& reduction) { return reduction->size == size; });
  if (known == reductions_.end()) {
    if (rows_ > 0) return std::nullopt;  // too late
    reductions_.push_back(std::make_unique<Reduction>(whole_, size));
    if (picture_ == nullptr) return std::nullopt;
    for (std::uint32_t y = 0; y < whole_.height; ++y) reductions_.back()->addRow(picture_->row(y));
    return make(longerSide, room);
  }
  const Image<RGBA8Pixel>& small = (*known)->result();
  const auto* pixels = reinterpret_cast<const std::uint8_t*>(small.data.get());
  for (const int quality : {95, 90, 80, 65, 40}) {
    std::vector<std::uint8_t> file =
        encodeJpeg(pixels, size.width, size.height, quality, {}, Chroma::whole);
    removeJfif(file);
    if (file.size() <= room) return Thumbnail{std::move(file), size};
  }
  return std::nullopt;
}

}  // namespace pelorin::photo
