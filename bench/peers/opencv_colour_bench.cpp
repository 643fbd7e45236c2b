// OpenCV's tables, Lab conversion and histogram beside what comes nearest to them here, on the same
// 12 megapixels and one thread. The work is of the same kind, not the same: only the tables give
// equal bytes.
#include <benchmark/benchmark.h>

#include <opencv2/core.hpp>
#include <opencv2/imgproc.hpp>

#include "bench/support/per_pixel.h"
#include "image_processing/autoenhance/enhance_row.h"
#include "image_processing/dupe/green_cdf.h"
#include "image_processing/filters/looks/apply_look.h"
#include "image_processing/filters/looks/preset_looks.h"
#include "tests/support/looks.h"

namespace pelorin::bench {
namespace {

using namespace image_processing;

cv::Mat asMat(const Image<RGBA8Pixel>& picture) {
  return {static_cast<int>(picture.height), static_cast<int>(picture.width), CV_8UC4,
          picture.data.get()};
}

/// Runs `work` on one thread and reports its time a pixel.
template <typename Work>
void measure(benchmark::State& state, const Work& work) {
  cv::setNumThreads(1);
  for (auto _ : state) {
    work();
    benchmark::ClobberMemory();
  }
  reportPerPixel(state, twelveMegapixels().pixelCount());
}

/// A look without vignette and mix is one table a channel; this reads it off.
cv::Mat tableOf(const Look& look) {
  Image<RGBA8Pixel> ramp(256, 1), table(256, 1);
  for (int i = 0; i < 256; ++i) {
    const auto value = static_cast<std::uint8_t>(i);
    ramp.data.get()[i] = {value, value, value, value};
  }
  applyLookScalar(look, ramp, table);
  return asMat(table).clone();
}

void tablesOfOpenCv(benchmark::State& state) {
  const Look look = test_support::lookOf<WinterRGBFilter>(nullptr);
  const cv::Mat photo = asMat(twelveMegapixels()), table = tableOf(look);
  cv::Mat theirs;
  measure(state, [&] { cv::LUT(photo, table, theirs); });
  Image<RGBA8Pixel> ours(twelveMegapixels().width, twelveMegapixels().height);
  applyLook(look, twelveMegapixels(), ours);
  if (cv::norm(theirs, asMat(ours), cv::NORM_INF) != 0) state.SkipWithError("other bytes");
}
BENCHMARK(tablesOfOpenCv)->Unit(benchmark::kMillisecond);

void lookWithoutVignette(benchmark::State& state) {
  const Look look = test_support::lookOf<WinterRGBFilter>(nullptr);
  Image<RGBA8Pixel> output(twelveMegapixels().width, twelveMegapixels().height);
  measure(state, [&] { applyLook(look, twelveMegapixels(), output); });
}
BENCHMARK(lookWithoutVignette)->Unit(benchmark::kMillisecond);

void labAndBackOfOpenCv(benchmark::State& state) {
  cv::Mat photo, lab, back;
  cv::cvtColor(asMat(twelveMegapixels()), photo, cv::COLOR_RGBA2RGB);
  measure(state, [&] {
    cv::cvtColor(photo, lab, cv::COLOR_RGB2Lab);
    cv::cvtColor(lab, back, cv::COLOR_Lab2RGB);
  });
}
BENCHMARK(labAndBackOfOpenCv)->Unit(benchmark::kMillisecond);

void labToneCurveAndBack(benchmark::State& state) {
  const Image<RGBA8Pixel>& photo = twelveMegapixels();
  Image<RGBA8Pixel> output(photo.width, photo.height);
  const std::vector<float> curve = {0.0f, 0.6f, 1.0f};
  const TonePass pass(curve, 100.0f, 1.2f, 0.5f, 1.0f);
  const float* const noMask = nullptr;
  measure(state, [&] {
    enhanceRow(pass, photo.data.get(), noMask, noMask, output.data.get(), photo.pixelCount());
  });
}
BENCHMARK(labToneCurveAndBack)->Unit(benchmark::kMillisecond);

void histogramOfOpenCv(benchmark::State& state) {
  const cv::Mat photo = asMat(twelveMegapixels());
  cv::Mat histogram;
  const int green = 1, bins = 256;
  const float range[] = {0, 256};
  const float* ranges = range;
  measure(state,
          [&] { cv::calcHist(&photo, 1, &green, cv::noArray(), histogram, 1, &bins, &ranges); });
}
BENCHMARK(histogramOfOpenCv)->Unit(benchmark::kMillisecond);

void greenDistribution(benchmark::State& state) {
  GreenCDF cdf;
  measure(state, [&] {
    computeGreenCDF(twelveMegapixels(), cdf);
    benchmark::DoNotOptimize(cdf);
  });
}
BENCHMARK(greenDistribution)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace pelorin::bench
