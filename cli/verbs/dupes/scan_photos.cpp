#include "cli/verbs/dupes/scan_photos.h"

#include <filesystem>
#include <optional>
#include <set>

#include "cli/frame/file_bytes.h"
#include "cli/frame/jobs.h"

namespace pelorin::cli {
namespace {

std::optional<photo::FileStamp> stampOf(const Input& input) {
  return input.isStandardInput() ? std::nullopt : photo::stampOf(input.path);
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

  void readTheRest(const std::function<void(const photo::FailedPhoto&)>& onFailure,
                   const std::function<void()>& onDone, ScanResult& result) {
    const bool finished = attemptJobs<photo::PhotoRecord>(
        unread_.size(), options_.jobs,
        [&](std::size_t job) {
          stopIfInterrupted();
          return photo::readPhotoRecord(readInput(inputs_[unread_[job]]), options_.scale,
                                        interruptToken());
        },
        [&](std::size_t job, const Attempt<photo::PhotoRecord>& attempt) {
          const std::size_t i = unread_[job];
          if (attempt.result) {
            records_[i] = attempt.result;
            store(i, result.cacheTrouble);
          } else {
            result.failed.push_back({inputs_[i].path, attempt.error});
            onFailure(result.failed.back());
          }
          onDone();
        });
    result.interrupted = !finished || interruptRequested();
  }

  void moveInto(photo::PhotoLibrary& library) {
    for (std::size_t i = 0; i < inputs_.size(); ++i) {
      if (!records_[i]) continue;
      library.add(inputs_[i].path, *records_[i], stamps_[i], options_.assumeFileTime);
      records_[i].reset();
    }
  }

 private:
  // A cache that cannot be written costs the next run time, not this one its result.
  void store(std::size_t i, std::string& trouble) {
    if (options_.cache == nullptr || !stamps_[i] || !trouble.empty()) return;
    try {
      options_.cache->store(inputs_[i].path, *stamps_[i], options_.scale, *records_[i]);
    } catch (const photo::CacheError& error) {
      trouble = error.what();
    }
  }

  const std::vector<Input>& inputs_;
  const ScanOptions& options_;
  std::vector<std::optional<photo::FileStamp>> stamps_;  // taken before the file is read
  std::vector<std::optional<photo::PhotoRecord>> records_;
  std::vector<std::size_t> unread_;
};

}  // namespace

ScanResult scanPhotos(const std::vector<Input>& inputs, const ScanOptions& options,
                      const std::function<void(const photo::FailedPhoto&)>& onFailure,
                      const std::function<void()>& onDone) {
  ScanResult result;
  Scan scan(inputs, options);
  scan.lookUp(onDone);
  scan.readTheRest(onFailure, onDone, result);
  if (!result.interrupted) scan.moveInto(result.library);
  return result;
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
