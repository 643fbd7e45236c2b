#include "bench/report/threads.h"

#include <fmt/format.h>

#include <algorithm>
#include <functional>
#include <map>
#include <memory>
#include <vector>

#include "bench/report/child.h"
#include "bench/report/critical_path.h"
#include "bench/report/photos.h"
#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "photo/file_io.h"
#include "photo/filter_photo.h"
#include "photo/thread_workers.h"

namespace pelorin::bench {
namespace {

using namespace image_processing;

constexpr PhotoSize size = {4000, 3000};
constexpr int rounds = 5;

/// Some work on a picture with workers, or without.
struct Row {
  std::string name;
  std::function<void(Workers*)> work;
};

std::vector<Row> rows(const std::vector<std::uint8_t>& file) {
  std::vector<Row> rows;
  const auto filtered = [&](const std::string& name, const std::string& filter,
                            const std::string& params, std::uint64_t pixels) {
    rows.push_back({name, [&file, filter, params, pixels](Workers* workers) {
                      static photo::SparePixels spare;
                      photo::filterPhoto(file, {.filter = filter, .params = params}, nullptr,
                                         {.pixels = pixels, .spare = &spare, .workers = workers});
                    }});
  };
  constexpr std::uint64_t all = std::uint64_t{1} << 30;
  filtered("file to file, AE0", "AE0", "slider=0.4;", all);
  filtered("the same, decoded twice", "AE0", "slider=0.4;", 0);
  filtered("file to file, AE08bit", "AE08bit", "slider=0.4;", all);
  filtered("file to file, WinterRGB", "WinterRGB", "", all);
  filtered("file to file, PassThrough", "PassThrough", "", all);

  auto picture = std::make_shared<Image<RGBA8Pixel>>(size.width, size.height);
  fillWithPhoto(*picture);
  const Image<RGBA8Pixel> output(size.width, size.height);
  std::fill_n(output.data.get(), output.pixelCount(), RGBA8Pixel{});
  // One session each time but for moves of the slider, which have one for each number of workers.
  const auto session = [=](Workers* workers) {
    std::shared_ptr<Image<RGBA8Pixel>> photo = picture;
    return std::make_shared<FilteredImage>(photo, ImageMetadata{}, "", defaultFilterConfigValue,
                                           DefaultFilterFactory::filterFactory(), workers);
  };
  const auto apply = [=](FilteredImage& in) {
    Image<RGBA8Pixel> to = output;
    in.applyFilterWithParams("AE0", "slider=0.7;", defaultFilterConfigValue, to);
  };
  rows.push_back(
      {"session, AE0, first application", [=](Workers* workers) { apply(*session(workers)); }});
  auto sessions = std::make_shared<std::map<Workers*, std::shared_ptr<FilteredImage>>>();
  rows.push_back({"session, AE0, move of the slider", [=](Workers* workers) {
                    std::shared_ptr<FilteredImage>& known = (*sessions)[workers];
                    if (known == nullptr) known = session(workers);
                    apply(*known);
                  }});
  return rows;
}

double fastest(const std::vector<double>& seconds) {
  return *std::min_element(seconds.begin(), seconds.end());
}

}  // namespace

std::string threadsTable() {
  const PhotoFiles files(size);
  const std::vector<std::uint8_t> file = photo::readFile(files.first());
  photo::ThreadWorkers two(2);
  CriticalPath pathOfTwo(2), pathOfFour(4);

  std::string table =
      "| | 1 thread: ns/px | 2 threads: processor time | 2 threads: times as fast | 4 threads |\n"
      "|---|---:|---:|---:|---:|\n";
  for (const Row& row : rows(file)) {
    std::vector<double> alone, shared, ofTwo, ofFour;
    for (Workers* workers : {static_cast<Workers*>(nullptr), static_cast<Workers*>(&two),
                             static_cast<Workers*>(&pathOfTwo), static_cast<Workers*>(&pathOfFour)})
      row.work(workers);  // touches new memory
    for (int round = 0; round < rounds; ++round) {
      alone.push_back(secondsOf([&] { row.work(nullptr); }));
      shared.push_back(secondsOf([&] { row.work(&two); }));
      ofTwo.push_back(pathOfTwo.secondsOf([&] { row.work(&pathOfTwo); }));
      ofFour.push_back(pathOfFour.secondsOf([&] { row.work(&pathOfFour); }));
    }
    const double time = fastest(alone);
    table += fmt::format("| {} | {:.2f} | {:.2f} | {:.2f} | {:.2f} |\n", row.name,
                         time * 1e3 / size.megapixels(), fastest(shared) / time,
                         time / fastest(ofTwo), time / fastest(ofFour));
  }
  return table;
}

}  // namespace pelorin::bench
