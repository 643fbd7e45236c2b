#include "cli/verbs/dupes/scan_photos.h"

#include <filesystem>
#include <optional>
#include <set>

#include "cli/frame/each_photo.h"
#include "cli/frame/file_bytes.h"
#include "cli/frame/interrupt.h"
#include "cli/frame/limits.h"
#include "cli/frame/photo_files.h"
#include "photo/photo.h"

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
  void lookUp(Talk& talk) {
    for (std::size_t i = 0; i < inputs_.size() && !interruptRequested(); ++i) {
      stamps_[i] = stampOf(inputs_[i]);
      if (options_.cache != nullptr && stamps_[i]) {
        records_[i] = options_.cache->find(inputs_[i].path, *stamps_[i], options_.scale);
      }
      if (records_[i]) {
        talk.fileDone();
      } else {
        unread_.push_back(i);
      }
    }
  }

  void readTheRest(Talk& talk, ScanResult& result) {
    std::vector<Input> unread;
    for (const std::size_t i : unread_) unread.push_back(inputs_[i]);
    const PhotoTally tally = eachPhoto<photo::PhotoRecord>(
        unread, options_.jobs, talk,
        {.work =
             [&](std::size_t job) {
               const std::vector<std::uint8_t> file = readInput(unread[job]);
               const photo::DecodeLimits decode = limits().decode;
               tellNotices(unread[job], photo::openRows(file, {.limits = decode})->facts(), talk);
               return photo::readPhotoRecord(file, options_.scale, interruptToken(), decode);
             },
         .done =
             [&](std::size_t job, const photo::PhotoRecord& record) {
               records_[unread_[job]] = record;
               store(unread_[job], result.cacheTrouble);
             },
         .failed =
             [&](std::size_t job, const std::string& reason) {
               result.failed.push_back({unread[job].path, reason});
             }});
    result.interrupted = tally.interrupted || interruptRequested();
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

ScanResult scanPhotos(const std::vector<Input>& inputs, const ScanOptions& options, Talk& talk) {
  ScanResult result;
  Scan scan(inputs, options);
  scan.lookUp(talk);
  scan.readTheRest(talk, result);
  if (!result.interrupted) scan.moveInto(result.library);
  return result;
}

std::vector<Input> withoutRepetitions(const std::vector<Input>& inputs) {
  std::set<std::filesystem::path> seen;
  std::vector<Input> once;
  for (const Input& input : inputs) {
    // A link to a photo is the photo: neither may stand for the other.
    std::error_code failed;
    std::filesystem::path place = std::filesystem::weakly_canonical(input.path, failed);
    if (failed) place = std::filesystem::absolute(input.path).lexically_normal();
    if (seen.insert(place).second) once.push_back(input);
  }
  return once;
}

}  // namespace pelorin::cli
