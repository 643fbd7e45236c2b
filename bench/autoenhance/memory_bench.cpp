// Peak memory of one auto-enhanced photo, session image and output included, in a process of its
// own for each filter. Prints a table; exits 1 when a bound is broken.
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "tests/support/pictures.h"

namespace {

using namespace pelorin::image_processing;

constexpr std::uint32_t width = 4000, height = 3000;
constexpr double fixedBytes = 8 << 20;

long peakBytes() {
  rusage usage{};
  getrusage(RUSAGE_SELF, &usage);
  return usage.ru_maxrss * 1024;
}

/// Runs in a child: what the photo adds to the process's peak.
[[noreturn]] void measure(const char* filter, double bytesPerPixel) {
  DefaultFilterFactory::filterFactory();
  const long before = peakBytes();
  {
    // A plain pattern: a generated photo would itself need memory.
    auto image = std::make_shared<Image<RGBA8Pixel>>(width, height);
    for (std::size_t i = 0; i < image->pixelCount(); ++i) {
      const auto value = static_cast<std::uint8_t>(i * 2654435761u >> 24);
      image->data.get()[i] = {value, static_cast<std::uint8_t>(i >> 8), value, 255};
    }
    FilteredImage session(image, {}, "", defaultFilterConfigValue,
                          DefaultFilterFactory::filterFactory());
    Image<RGBA8Pixel> output(width, height);
    output.set({0, 0, 0, 0});
    session.applyFilterWithParams(filter, "slider=0.4;", defaultFilterConfigValue, output);
  }
  const double pixels = double{width} * height;
  const double used = static_cast<double>(peakBytes() - before);
  const bool holds = used <= bytesPerPixel * pixels + fixedBytes;
  std::printf("%-8s %5.1f MiB, %5.2f bytes a pixel; bound %2.0f bytes a pixel + 8 MiB: %s\n",
              filter, used / (1 << 20), used / pixels, bytesPerPixel, holds ? "holds" : "BROKEN");
  std::fflush(stdout);
  std::_Exit(holds ? 0 : 1);
}

bool measuredInAChild(const char* filter, double bytesPerPixel) {
  std::fflush(stdout);
  const pid_t child = fork();
  if (child == 0) measure(filter, bytesPerPixel);
  int status = 1;
  return child > 0 && waitpid(child, &status, 0) == child && status == 0;
}

}  // namespace

int main() {
  std::printf("Peak memory of one application at %u x %u:\n", width, height);
  const bool floats = measuredInAChild("AE0", 17);
  const bool bytes = measuredInAChild("AE08bit", 11);
  return floats && bytes ? 0 : 1;
}
