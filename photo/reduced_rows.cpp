#include "photo/reduced_rows.h"

#include <algorithm>
#include <utility>

namespace pelorin::photo {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;

std::uint8_t rounded(std::uint32_t sum, std::uint32_t count) {
  return static_cast<std::uint8_t>(count == 0 ? 0 : (sum + count / 2) / count);
}

class ReducedRows : public RowReader {
 public:
  ReducedRows(std::unique_ptr<RowReader> reader, std::uint32_t divisor)
      : reader_(std::move(reader)),
        divisor_(divisor),
        strip_(reader_->size().width, std::min(divisor, reader_->size().height)),
        rowsLeft_(reader_->size().height) {
    facts_ = reader_->facts();
    metadata_ = reader_->metadata();
    const PictureSize whole = reader_->size();
    size_ = {(whole.width + divisor - 1) / divisor, (whole.height + divisor - 1) / divisor};
  }

  void read(RGBA8Pixel* rows, std::uint32_t count) override {
    for (std::uint32_t y = 0; y < count; ++y) {
      const std::uint32_t height = std::min(divisor_, rowsLeft_);
      reader_->read(strip_.data.get(), height);
      rowsLeft_ -= height;
      for (std::uint32_t x = 0; x < size_.width; ++x)
        rows[std::size_t{y} * size_.width + x] = average(x * divisor_, height);
    }
  }

 private:
  RGBA8Pixel average(std::uint32_t left, std::uint32_t height) const {
    const std::uint32_t right = std::min(left + divisor_, strip_.width);
    std::uint32_t r = 0, g = 0, b = 0, a = 0;
    for (std::uint32_t y = 0; y < height; ++y) {
      const RGBA8Pixel* row = strip_.row(y);
      for (std::uint32_t x = left; x < right; ++x) {
        const std::uint32_t seen = row[x].a;
        r += seen * row[x].r;
        g += seen * row[x].g;
        b += seen * row[x].b;
        a += seen;
      }
    }
    return {rounded(r, a), rounded(g, a), rounded(b, a), rounded(a, height * (right - left))};
  }

  std::unique_ptr<RowReader> reader_;
  std::uint32_t divisor_;
  Image<RGBA8Pixel> strip_;
  std::uint32_t rowsLeft_;
};

}  // namespace

std::unique_ptr<RowReader> reducedRows(std::unique_ptr<RowReader> reader, std::uint32_t divisor) {
  return std::make_unique<ReducedRows>(std::move(reader), divisor);
}

}  // namespace pelorin::photo
