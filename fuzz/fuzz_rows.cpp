// A picture, faces, a filter, a configuration and a height of bands: filtered by rows it must have
// the bytes of the filter on the whole picture.
#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <iterator>
#include <memory>
#include <string>

#include "image_processing/core/picture_rows.h"
#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"

using namespace pelorin::image_processing;

namespace {

/// The bytes, again from the first when they do not suffice.
class Bytes {
 public:
  Bytes(const std::uint8_t* data, std::size_t size) : data_(data), size_(size) {}
  std::uint8_t next() { return size_ == 0 ? 0 : data_[at_++ % size_]; }
  std::uint32_t below(std::uint32_t bound) { return (next() << 8 | next()) % bound; }

 private:
  const std::uint8_t* data_;
  std::size_t size_, at_ = 0;
};

// Smooth, with the bytes as texture, so that masks have something to find.
Image<RGBA8Pixel> pictureOf(std::uint32_t width, std::uint32_t height, Bytes& bytes) {
  Image<RGBA8Pixel> picture(width, height);
  const std::uint32_t texture = 1 + bytes.below(255);
  for (std::uint32_t y = 0; y < height; ++y) {
    for (std::uint32_t x = 0; x < width; ++x) {
      const auto level = [&](std::uint32_t slope) {
        return static_cast<std::uint8_t>((x * slope + y) / 2 + bytes.next() % texture);
      };
      picture.row(y)[x] = {level(1), level(2), level(3), bytes.next()};
    }
  }
  return picture;
}

ImageMetadata facesOf(std::uint32_t width, std::uint32_t height, Bytes& bytes) {
  ImageMetadata metadata;
  for (std::uint32_t count = bytes.below(3); count > 0; --count) {
    const auto place = [&](std::uint32_t side) {
      return static_cast<std::int32_t>(bytes.below(2 * side)) - static_cast<std::int32_t>(side / 2);
    };
    const std::int32_t left = place(width), top = place(height);
    metadata.faces.push_back(std::make_shared<BoundingBox>(
        BoundingBox{.left = left, .right = place(width), .bottom = place(height), .top = top}));
  }
  return metadata;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  Bytes bytes(data, size);
  const auto factory = DefaultFilterFactory::filterFactory();
  const auto& filters = factory->descriptions;
  const FilterDescription& filter =
      *std::next(filters.begin(), bytes.below(static_cast<std::uint32_t>(filters.size())))->second;
  const bool thin = bytes.below(4) == 0;
  RowRequest request{1 + bytes.below(130), 1 + bytes.below(thin ? 3 : 130)};
  if (bytes.below(2) == 0) std::swap(request.width, request.height);
  request.metadata = facesOf(request.width, request.height, bytes);
  request.params = "slider=" + std::to_string(bytes.below(12) / 10.0) + ";";
  if (bytes.below(8) == 0) request.params += "gtmOnly=true;";
  if (bytes.below(4) == 0) {
    request.config.ltmMaskRadius = static_cast<std::int32_t>(bytes.below(350)) - 1;
  }
  const Image<RGBA8Pixel> picture = pictureOf(request.width, request.height, bytes);

  auto photo = std::make_shared<Image<RGBA8Pixel>>(picture);
  FilteredImage session(photo, request.metadata, "", request.config, factory);
  Image<RGBA8Pixel> expected(picture.width, picture.height);
  session.applyFilterWithParams(filter.name, request.params, request.config, expected);

  constexpr std::uint32_t bandHeights[] = {1, 7, 16, 64, 1000};
  const RowWork work{.bandHeight = bandHeights[bytes.below(std::size(bandHeights))]};
  const std::unique_ptr<RowFilter> rows = filter.makeRowFilter(request);
  PictureSource first(picture), second(picture);
  Image<RGBA8Pixel> actual(picture.width, picture.height);
  PictureSink sink(actual);
  const bool done =
      (!rows->looksFirst() || rows->look(first, work)) && rows->filter(second, sink, work);
  if (!done) std::abort();
  if (std::memcmp(actual.data.get(), expected.data.get(), expected.byteSize()) != 0) std::abort();
  return 0;
}
