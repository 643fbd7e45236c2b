// Writes an enhanced copy of a photo, upright and with its metadata kept: enhance_file IN OUT [SLIDER]
#include <cstdio>
#include <exception>
#include <string>

#include "photo/file_io.h"
#include "photo/filter_photo.h"
#include "photo/thread_workers.h"

using namespace pelorin;

int main(int argc, char** argv) {
  if (argc != 3 && argc != 4) {
    std::fprintf(stderr, "usage: enhance_file IN OUT [SLIDER]\n");
    return 2;
  }
  const std::string slider = argc == 4 ? argv[3] : "0.4";
  try {
    photo::ThreadWorkers workers;  // every core
    const photo::FilteredPhoto better = photo::filterPhoto(
        photo::readFile(argv[1]), {.filter = "AE0", .params = "slider=" + slider + ";"},
        /*format=*/nullptr, {.workers = &workers});
    photo::writeFileAtomically(argv[2], better.file, {.mayReplace = false});
    for (const photo::Loss& loss : better.lost) {
      std::fprintf(stderr, "%s: lost %s\n", argv[2], loss.what.c_str());
    }
  } catch (const std::exception& error) {  // "photo.jpg: damaged: the picture data ends early"
    std::fprintf(stderr, "%s: %s\n", argv[1], error.what());
    return 1;
  }
  return 0;
}
