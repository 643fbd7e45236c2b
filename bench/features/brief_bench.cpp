#include <benchmark/benchmark.h>

#include "bench/features/grey_pictures.h"
#include "bench/support/side_by_side.h"
#include "image_processing/features/brief.h"
#include "image_processing/features/brief_bits.h"

namespace pelorin::bench {
namespace {

// Corners all over the picture, in raster order, as a detector gives them.
std::vector<xy> corners(const image_processing::Image<unsigned char>& image) {
  std::vector<xy> result;
  for (int y = 16; y + 16 < static_cast<int>(image.height); y += 15) {
    for (int x = 16; x + 16 < static_cast<int>(image.width); x += 15) result.push_back({x, y});
  }
  return result;
}

// Times are for a corner, not for a pixel.
void brief(benchmark::State& state) {
  const auto image = greyPicture(photo);
  const auto positions = corners(image);
  std::vector<image_processing::BriefDescriptor> descriptors;
  sideBySide(
      state, positions.size(), image.data.get(), image.byteSize(),
      [&] {
        for (const xy& p : positions) {
          benchmark::DoNotOptimize(
              image_processing::briefBitsScalar(image.row(p.y) + p.x, image.width));
        }
      },
      [&] {
        descriptors.clear();
        image_processing::brief(positions.data(), static_cast<int>(positions.size()), image,
                                descriptors);
        benchmark::DoNotOptimize(descriptors.data());
      });
}

BENCHMARK(brief)->UseManualTime()->Iterations(turns)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace pelorin::bench
