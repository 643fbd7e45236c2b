#include "image_processing/filters/pass_through.h"

#include <algorithm>
#include <cstring>
#include <functional>

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
  const std::size_t bytes = std::min(source.byteSize(), output.byteSize());
  const auto* const from = reinterpret_cast<const std::uint8_t*>(source.data.get());
  auto* const to = reinterpret_cast<std::uint8_t*>(output.data.get());
  const std::less<const std::uint8_t*> isBelow;
  const bool overlap = isBelow(from, to + bytes) && isBelow(to, from + bytes);
  const std::size_t parts = overlap ? 1 : tasksFor(state->workers);
  runTasks(state->workers, parts, [&](std::size_t part) {
    const auto first = static_cast<std::size_t>(partStart(bytes, part, parts));
    const auto end = static_cast<std::size_t>(partStart(bytes, part + 1, parts));
    std::memmove(to + first, from + first, end - first);
  });
}

}  // namespace pelorin::image_processing
