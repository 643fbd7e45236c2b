#include "image_processing/filters/pass_through.h"

#include <algorithm>
#include <cstring>

#include "image_processing/filters/mapped_rows.h"

namespace pelorin::image_processing {
namespace {

class PassThroughRows : public RowFilter {
 public:
  PassThroughRows(std::uint32_t width, std::uint32_t height) : width_(width), height_(height) {}

  bool filter(RowSource& rows, RowSink& filtered, const RowWork& work) override {
    return mapRows(width_, height_, rows, filtered, work,
                   [](auto, const RGBA8Pixel* from, auto...) { return from; });
  }

 private:
  std::uint32_t width_, height_;
};

}  // namespace

std::unique_ptr<RowFilter> PassThrough::forRows(const RowRequest& request) {
  return std::make_unique<PassThroughRows>(request.width, request.height);
}

void PassThrough::init(const std::string&) {}

void PassThrough::applyConfig(const std::string&, const FilterConfig&, Image<RGBA8Pixel>& output) {
  const Image<RGBA8Pixel>& source = *state->image;
  if (output.data == source.data) return;
  std::memmove(output.data.get(), source.data.get(),
               std::min(source.byteSize(), output.byteSize()));
}

}  // namespace pelorin::image_processing
