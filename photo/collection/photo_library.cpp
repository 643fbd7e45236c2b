#include "photo/collection/photo_library.h"

#include <fmt/chrono.h>
#include <fmt/format.h>

#include <ctime>
#include <set>
#include <utility>

#include "cli/frame/jobs.h"

namespace pelorin::cli {
namespace {

std::string textOfFileTime(const FileStamp& stamp) {
  return fmt::format("{:%Y-%m-%dT%H:%M:%S%z}",
                     fmt::localtime(static_cast<std::time_t>(stamp.modified / 1'000'000'000)));
}

class Scan {
 public:
  Scan(const std::vector<Input>& inputs, const ScanOptions& options)
      : inputs_(inputs), options_(options), stamps_(inputs.size()), records_(inputs.size()) {}

  /// What needs no reading of photos.
  void lookUp(const std::function<void()>& onDone) {
    for (std::size_t i = 0; i < inputs_.size() && !interruptRequested(); ++i) {
      stamps_[i] = stampOf(inputs_[i]);
      if (options_.cache != nullptr && stamps_[i]) {
        records_[i] = options_.cache->find(inputs_[i].path, *stamps_[i], options_.scale);
      }
      if (records_[i]) {
        onDone();
      } else {
        unread_.push_back(i);
      }
    }
  }

  void readTheRest(const std::function<void(const FailedPhoto&)>& onFailure,
                   const std::function<void()>& onDone, PhotoLibrary& library) {
    const bool finished = attemptJobs<PhotoRecord>(
        unread_.size(), options_.jobs,
        [&](std::size_t job) {
          stopIfInterrupted();
          return readPhotoRecord(inputs_[unread_[job]], options_.scale);
        },
        [&](std::size_t job, const Attempt<PhotoRecord>& attempt) {
          const std::size_t i = unread_[job];
          if (attempt.result) {
            records_[i] = attempt.result;
            store(i, library.cacheTrouble);
          } else {
            library.failed.push_back({inputs_[i], attempt.error});
            onFailure(library.failed.back());
          }
          onDone();
        });
    library.interrupted = !finished || interruptRequested();
  }

  void moveInto(PhotoLibrary& library) {
    for (std::size_t i = 0; i < inputs_.size(); ++i) {
      if (!records_[i]) continue;
      const PhotoRecord& record = *records_[i];
      ScannedPhoto photo = {inputs_[i],
                            record.width,
                            record.height,
                            record.orientation,
                            std::nullopt,
                            TimeSource::none,
                            ""};
      Shot shot = {record.cdf, record.orientation, std::nullopt};
      if (stamps_[i]) photo.bytes = stamps_[i]->bytes;
      if (record.captureTime) {
        photo.timeSource = TimeSource::camera;
        photo.time = record.captureTime->text;
        shot.time = shotTime(*record.captureTime);
      } else if (options_.assumeFileTime && stamps_[i]) {
        photo.timeSource = TimeSource::file;
        photo.time = textOfFileTime(*stamps_[i]);
        shot.time = fileTime(*stamps_[i]);
      }
      library.photos.push_back(std::move(photo));
      library.shots.push_back(shot);
      records_[i].reset();
    }
  }

 private:
  // A cache that cannot be written costs the next run time, not this one its result.
  void store(std::size_t i, std::string& trouble) {
    if (options_.cache == nullptr || !stamps_[i] || !trouble.empty()) return;
    try {
      options_.cache->store(inputs_[i].path, *stamps_[i], options_.scale, *records_[i]);
    } catch (const CacheError& error) {
      trouble = error.what();
    }
  }

  const std::vector<Input>& inputs_;
  const ScanOptions& options_;
  std::vector<std::optional<FileStamp>> stamps_;  // taken before the file is read
  std::vector<std::optional<PhotoRecord>> records_;
  std::vector<std::size_t> unread_;
};

}  // namespace

PhotoLibrary scanPhotos(const std::vector<Input>& inputs, const ScanOptions& options,
                        const std::function<void(const FailedPhoto&)>& onFailure,
                        const std::function<void()>& onDone) {
  PhotoLibrary library;
  Scan scan(inputs, options);
  scan.lookUp(onDone);
  scan.readTheRest(onFailure, onDone, library);
  if (!library.interrupted) scan.moveInto(library);
  return library;
}

std::vector<Input> withoutRepetitions(const std::vector<Input>& inputs) {
  std::set<std::filesystem::path> seen;
  std::vector<Input> once;
  for (const Input& input : inputs) {
    const bool isNew = seen.insert(std::filesystem::absolute(input.path).lexically_normal()).second;
    if (isNew) once.push_back(input);
  }
  return once;
}

}  // namespace pelorin::cli
