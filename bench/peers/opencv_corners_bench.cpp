// The same corners from OpenCV, to compare times with those of corners/detect.
#include <benchmark/benchmark.h>

#include <cstdlib>
#include <opencv2/features2d.hpp>

#include "bench/support/per_pixel.h"
#include "image_processing/features/fast.h"
#include "tests/kernels/kernel_pictures.h"
#include "tests/support/grey_pictures.h"

namespace pelorin::bench {
namespace {

using test_support::PictureKind;

constexpr int threshold = 20;

bool sameCorners(const std::vector<cv::KeyPoint>& theirs, const xy* ours, int count) {
  if (static_cast<int>(theirs.size()) != count) return false;
  for (int i = 0; i < count; ++i) {
    const xy corner = {static_cast<int>(theirs[i].pt.x), static_cast<int>(theirs[i].pt.y)};
    if (!(corner == ours[i])) return false;
  }
  return true;
}

void openCvFast9(benchmark::State& state) {
  cv::setNumThreads(1);
  const auto kind = static_cast<PictureKind>(state.range(0));
  const auto image = test_support::greenOf(test_support::pictureOf(kind, 4000, 3000));
  const int width = static_cast<int>(image.width), height = static_cast<int>(image.height);
  const cv::Mat pixels(height, width, CV_8U, image.data.get());
  const auto detector =
      cv::FastFeatureDetector::create(threshold, true, cv::FastFeatureDetector::TYPE_9_16);
  std::vector<cv::KeyPoint> theirs;
  for (auto _ : state) {
    detector->detect(pixels, theirs);
    benchmark::DoNotOptimize(theirs.data());
  }
  int count = 0;
  xy* const ours = fast9_detect_nonmax(image.data.get(), width, height, width, threshold, &count);
  if (!sameCorners(theirs, ours, count)) state.SkipWithError("OpenCV finds other corners");
  std::free(ours);
  state.counters["corners"] = count;
  reportPerPixel(state, image.pixelCount());
  state.SetLabel(nameOf(kind));
}
BENCHMARK(openCvFast9)
    ->DenseRange(static_cast<int>(PictureKind::photo), static_cast<int>(PictureKind::smooth));

}  // namespace
}  // namespace pelorin::bench
