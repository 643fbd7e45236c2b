#pragma once

#include <gtest/gtest.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <map>
#include <memory>
#include <utility>

#include "image_processing/core/picture_rows.h"
#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "image_processing/filters/row_filter.h"
#include "photo/thread_workers.h"

namespace pelorin::image_processing {

/// Rows that come into the room they are given, as a decoder's do.
class DecodedRows : public RowSource {
 public:
  explicit DecodedRows(Image<RGBA8Pixel> picture) : picture_(std::move(picture)) {}

  const RGBA8Pixel* next(std::uint32_t count, RGBA8Pixel* room) override {
    std::copy_n(picture_.row(next_), std::size_t{picture_.width} * count, room);
    next_ += count;
    return room;
  }

 private:
  Image<RGBA8Pixel> picture_;
  std::uint32_t next_ = 0;
};

/// In a session.
inline Image<RGBA8Pixel> byPicture(const FilterDescription& filter,
                                   const Image<RGBA8Pixel>& picture, const RowRequest& request,
                                   Workers* workers = nullptr) {
  auto photo = std::make_shared<Image<RGBA8Pixel>>(picture);
  FilteredImage session(photo, request.metadata, "", request.config,
                        DefaultFilterFactory::filterFactory(), workers);
  Image<RGBA8Pixel> output(picture.width, picture.height);
  session.applyFilterWithParams(filter.name, request.params, request.config, output);
  return output;
}

/// By rows that come from a `Source`.
template <typename Source>
Image<RGBA8Pixel> byRows(const FilterDescription& filter, const Image<RGBA8Pixel>& picture,
                         const RowRequest& request, const RowWork& work) {
  const std::unique_ptr<RowFilter> rows = filter.makeRowFilter(request);
  if (rows->looksFirst()) {
    Source source(picture);
    EXPECT_TRUE(rows->look(source, work));
  }
  Image<RGBA8Pixel> output(picture.width, picture.height);
  Source source(picture);
  PictureSink sink(output);
  EXPECT_TRUE(rows->filter(source, sink, work));
  return output;
}

/// So many threads, the same ones each time.
inline Workers& threads(std::size_t count) {
  static std::map<std::size_t, photo::ThreadWorkers> all;
  return all.try_emplace(count, count).first->second;
}

}  // namespace pelorin::image_processing
