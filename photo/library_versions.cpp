#include "photo/library_versions.h"

// jpeglib.h needs size_t and FILE from before it.
// clang-format off
#include <cstddef>
#include <cstdio>
#include <jpeglib.h>
// clang-format on

#include <fmt/core.h>
#include <hwy/highway.h>
#include <lcms2.h>
#include <png.h>
#include <sqlite3.h>
#include <zlib.h>

#include <pugixml.hpp>

namespace pelorin::photo {
namespace {

// 90100 in base 100 is 9.1.0.
std::string dotted(int number, int base) {
  return fmt::format("{}.{}.{}", number / (base * base), number / base % base, number % base);
}

}  // namespace

std::vector<LibraryVersion> libraryVersions() {
  const int lcms = cmsGetEncodedCMMversion();
  return {
      {"fmt", dotted(FMT_VERSION, 100)},
      {"highway", fmt::format("{}.{}.{}", HWY_MAJOR, HWY_MINOR, HWY_PATCH)},
      {"lcms2", fmt::format("{}.{}", lcms / 1000, lcms / 10 % 100)},
#ifdef LIBJPEG_TURBO_VERSION_NUMBER
      {"libjpeg-turbo", dotted(LIBJPEG_TURBO_VERSION_NUMBER, 1000)},
#else
      {"libjpeg", fmt::format("{}", JPEG_LIB_VERSION)},
#endif
      {"libpng", png_get_libpng_ver(nullptr)},
      {"pugixml", fmt::format("{}.{}", PUGIXML_VERSION / 1000, PUGIXML_VERSION / 10 % 100)},
      {"sqlite3", sqlite3_libversion()},
      {"zlib", zlibVersion()},
  };
}

}  // namespace pelorin::photo
