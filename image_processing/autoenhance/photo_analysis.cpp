#include "image_processing/autoenhance/photo_analysis.h"

#include <atomic>
#include <vector>

#include "image_processing/filters/row_bands.h"

namespace pelorin::image_processing {
namespace {

/// Where each of some parts of the rows begins, and the last one ends. A row of the grid belongs to
/// one part, so that its nodes add up their pixels in order.
std::vector<std::uint32_t> divideRows(const AnalysisSubject& subject, std::size_t parts) {
  std::vector<std::uint32_t> starts;
  if (subject.grid == nullptr) {
    for (std::size_t i = 0; i <= parts; ++i) {
      starts.push_back(static_cast<std::uint32_t>(partStart(subject.height, i, parts)));
    }
    return starts;
  }
  const std::int64_t gridRows = subject.grid->rows;
  std::uint32_t y = 0;
  for (std::size_t i = 0; i < parts; ++i) {
    const auto first =
        static_cast<std::int64_t>(partStart(static_cast<std::uint64_t>(gridRows), i, parts));
    while (y < subject.height && nearestNode(y, subject.cellSize, gridRows) < first) ++y;
    starts.push_back(y);
  }
  starts.push_back(subject.height);
  return starts;
}

}  // namespace

PhotoAnalysis::PhotoAnalysis(const AnalysisSubject& subject)
    : width_(subject.width),
      lightness_(subject.width),
      faces_(subject.metadata, subject.width, subject.height, lightnessBins, lightnessScale) {
  if (subject.grid != nullptr) splatter_.emplace(*subject.grid, subject.width, subject.cellSize);
}

void PhotoAnalysis::addRow(std::uint32_t y, const RGBA8Pixel* pixels) {
  const float* const row = lightness_.of(pixels);
  if (splatter_) splatter_->addRow(y, row);
  counter_.add(row, width_);
  faces_.addRow(y, pixels);
}

void PhotoAnalysis::add(const PhotoAnalysis& other) {
  counter_.add(other.counter_);
  faces_.add(other.faces_);
}

std::optional<ImageStatistics> analysePhoto(const AnalysisSubject& subject,
                                            const RGBA8Pixel* pixels, Workers* workers,
                                            std::uint32_t bandHeight,
                                            const std::function<bool()>& stop) {
  const std::size_t parts = tasksFor(workers);
  const std::vector<std::uint32_t> starts = divideRows(subject, parts);
  std::vector<std::optional<PhotoAnalysis>> found(parts);
  std::atomic<bool> stopped = false;
  runTasks(workers, parts, [&](std::size_t i) {
    PhotoAnalysis& part = found[i].emplace(subject);
    for (std::uint32_t y = starts[i]; y < starts[i + 1]; ++y) {
      if (stop && (y - starts[i]) % bandHeight == 0 && (stopped || stop())) {
        stopped = true;
        return;
      }
      part.addRow(y, pixels + std::size_t{subject.width} * y);
    }
  });
  if (stopped) return std::nullopt;
  for (std::size_t i = 1; i < parts; ++i) found[0]->add(*found[i]);
  return found[0]->statistics();
}

std::optional<ImageStatistics> analysePhoto(const AnalysisSubject& subject, RowSource& rows,
                                            const RowWork& work) {
  if (const RGBA8Pixel* const pixels = rows.standing())
    return analysePhoto(subject, pixels, work.workers, work.bandHeight, work.stop);
  PhotoAnalysis found(subject);
  RowBands bands(subject.width, subject.height, work, 2);
  const Stage read = {1, [&](std::int64_t band, std::size_t) { bands.read(band, rows); }};
  const Stage look = {1, [&](std::int64_t band, std::size_t) {
                        const RGBA8Pixel* row = bands.pixels(band);
                        const std::uint32_t first = bands.first(band);
                        const std::uint32_t end = first + bands.rows(band);
                        for (std::uint32_t y = first; y < end; ++y, row += subject.width)
                          found.addRow(y, row);
                      }};
  if (!runStages(bands.count(), {read, look}, work.workers, work.stop)) return std::nullopt;
  return found.statistics();
}

ImageStatistics analysePhoto(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                             Workers* workers) {
  return *analysePhoto({photo.width, photo.height, metadata}, photo.data.get(), workers);
}

}  // namespace pelorin::image_processing
