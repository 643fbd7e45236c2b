// Prints the near-duplicates in a folder, a group a line, the one to keep first: near_duplicates FOLDER
#include <algorithm>
#include <cstdio>
#include <exception>
#include <filesystem>
#include <string>
#include <vector>

#include "photo/collection/best_photo.h"
#include "photo/collection/grouping.h"
#include "photo/collection/pair_search.h"
#include "photo/collection/photo_library.h"
#include "photo/collection/photo_record.h"
#include "photo/collection/photo_score.h"
#include "photo/file_io.h"
#include "photo/photo_error.h"

using namespace pelorin;

namespace {

// What the command takes: of photos that reach it, few are no near-duplicates.
constexpr float threshold = 1.5f;

// The photos of a folder; what is none is named and left out.
photo::PhotoLibrary libraryOf(const std::string& folder) {
  std::vector<std::string> paths;
  for (const auto& entry : std::filesystem::directory_iterator(folder)) {
    if (entry.is_regular_file()) paths.push_back(entry.path().string());
  }
  std::sort(paths.begin(), paths.end());
  photo::PhotoLibrary library;
  for (const std::string& path : paths) {
    try {
      const auto stamp = photo::stampOf(path);
      const photo::PhotoRecord record = photo::readPhotoRecord(photo::readFile(path));
      library.add(path, record, stamp, /*assumeFileTime=*/true);
    } catch (const photo::PhotoError& error) {
      std::fprintf(stderr, "%s: %s\n", path.c_str(), error.what());
    }
  }
  return library;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) {
    std::fprintf(stderr, "usage: near_duplicates FOLDER\n");
    return 2;
  }
  try {
    photo::PhotoLibrary library = libraryOf(argv[1]);
    const auto pairs = photo::findPairs(library.shots, threshold);
    const auto groups = photo::groupWholly(library.photos.size(), pairs);
    for (const std::size_t i : photo::photosToScore(groups, library.photos)) {
      library.photos[i].niqe = photo::scoreOf(photo::readFile(library.photos[i].path));
    }
    for (const photo::DupeGroup& group : groups) {
      for (const photo::Ranked& ranked : photo::rankGroup(group, library.photos)) {
        std::printf("%s (%s)  ", library.photos[ranked.photo].path.c_str(), ranked.reason.c_str());
      }
      std::printf("\n");
    }
  } catch (const std::exception& error) {
    std::fprintf(stderr, "%s: %s\n", argv[1], error.what());
    return 1;
  }
  return 0;
}
