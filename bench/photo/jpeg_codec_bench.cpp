// Coding a 12-megapixel photo: what every use of the command line pays before and after the filter.
#include <benchmark/benchmark.h>

#include "photo/jpeg/jpeg_codec.h"
#include "tests/support/pictures.h"

namespace pelorin::photo {
namespace {

constexpr std::uint32_t width = 4000, height = 3000;
constexpr int quality = 90;

const std::vector<std::uint8_t>& photo() {
  static const std::vector<std::uint8_t> file = [] {
    const auto picture = test_support::photoLikePicture(width, height, /*seed=*/1);
    return encodeJpeg(&picture.data.get()->r, width, height, quality);
  }();
  return file;
}

void countPixels(benchmark::State& state) {
  state.SetItemsProcessed(state.iterations() * std::int64_t{width} * height);
  state.counters["file_bytes"] = static_cast<double>(photo().size());
}

void decode(benchmark::State& state) {
  for (auto _ : state) {
    benchmark::DoNotOptimize(decodeJpeg(photo(), static_cast<int>(state.range(0))).pixels.get());
  }
  countPixels(state);
}
BENCHMARK(decode)->Arg(1)->Arg(2)->Arg(4)->Arg(8)->Unit(benchmark::kMillisecond);

void encode(benchmark::State& state) {
  const DecodedPicture picture = decodeJpeg(photo());
  for (auto _ : state) {
    benchmark::DoNotOptimize(encodeJpeg(picture.pixels.get(), width, height, quality).data());
  }
  countPixels(state);
}
BENCHMARK(encode)->Unit(benchmark::kMillisecond);

void decodeAndEncode(benchmark::State& state) {
  for (auto _ : state) {
    const DecodedPicture picture = decodeJpeg(photo());
    benchmark::DoNotOptimize(encodeJpeg(picture.pixels.get(), width, height, quality).data());
  }
  countPixels(state);
}
BENCHMARK(decodeAndEncode)->Unit(benchmark::kMillisecond);

void rotate(benchmark::State& state) {
  for (auto _ : state) benchmark::DoNotOptimize(rotateJpeg(photo(), 90).data());
  countPixels(state);
}
BENCHMARK(rotate)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace pelorin::photo
