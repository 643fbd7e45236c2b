#include "photo/unsupported_formats.h"

#include <algorithm>
#include <array>

namespace pelorin::photo {
namespace {

using Bytes = std::span<const std::uint8_t>;

bool holds(Bytes file, std::size_t at, std::string_view text) {
  return file.size() >= at + text.size() &&
         std::equal(text.begin(), text.end(), file.begin() + static_cast<std::ptrdiff_t>(at),
                    [](char a, std::uint8_t b) { return static_cast<std::uint8_t>(a) == b; });
}

// Whether an ISO media file is of one of these brands: its first box lists them, the main one and
// then, after a version, those it is compatible with.
bool isOfBrand(Bytes file, std::span<const std::string_view> brands) {
  if (!holds(file, 4, "ftyp")) return false;
  const std::size_t length = file[0] << 24 | file[1] << 16 | file[2] << 8 | file[3];
  const std::size_t end = std::min(length, file.size());
  for (std::size_t at = 8; at + 4 <= end; at += at == 8 ? 8 : 4) {
    for (const std::string_view brand : brands) {
      if (holds(file, at, brand)) return true;
    }
  }
  return false;
}

bool isTiff(Bytes file) {
  return holds(file, 0, std::string_view("II*\0", 4)) ||
         holds(file, 0, std::string_view("MM\0*", 4));
}

// Raw files of most cameras are TIFF files, told apart by who made them, in the first directory.
bool namesMaker(Bytes file, std::string_view maker) {
  const Bytes head = file.first(std::min<std::size_t>(file.size(), 4096));
  return isTiff(file) && std::search(head.begin(), head.end(), maker.begin(), maker.end(),
                                     [](std::uint8_t a, char b) {
                                       return a == static_cast<std::uint8_t>(b);
                                     }) != head.end();
}

// The tag DNGVersion, four bytes long, in either byte order.
bool hasDngVersion(Bytes file) {
  using namespace std::string_view_literals;
  return namesMaker(file, "\x12\xC6\x01\x00\x04\x00\x00\x00"sv) ||
         namesMaker(file, "\xC6\x12\x00\x01\x00\x00\x00\x04"sv);
}

constexpr std::array<std::string_view, 8> heicBrands = {"heic", "heix", "heim", "heis",
                                                        "hevc", "hevx", "mif1", "msf1"};
constexpr std::array<std::string_view, 2> avifBrands = {"avif", "avis"};
constexpr std::array<std::string_view, 1> cr3Brands = {"crx "};

struct Row {
  UnsupportedFormat format;
  bool (*recognises)(Bytes file);
};

constexpr std::string_view develop = "darktable-cli photo out.jpg";
constexpr std::string_view convert = "convert photo out.png";

// The first that fits counts, so that what others contain comes first.
constexpr std::array<Row, 15> rows = {{
    {{"a Canon raw photo (CR2)", develop}, [](Bytes f) { return isTiff(f) && holds(f, 8, "CR"); }},
    {{"a Canon raw photo (CR3)", develop}, [](Bytes f) { return isOfBrand(f, cr3Brands); }},
    {{"a raw photo (DNG)", develop}, hasDngVersion},
    {{"a Nikon raw photo (NEF)", develop}, [](Bytes f) { return namesMaker(f, "NIKON"); }},
    {{"a Sony raw photo (ARW)", develop}, [](Bytes f) { return namesMaker(f, "SONY"); }},
    {{"a Pentax raw photo (PEF)", develop}, [](Bytes f) { return namesMaker(f, "PENTAX"); }},
    {{"a Fujifilm raw photo (RAF)", develop},
     [](Bytes f) { return holds(f, 0, "FUJIFILMCCD-RAW"); }},
    {{"an Olympus raw photo (ORF)", develop},
     [](Bytes f) { return holds(f, 0, "IIRO") || holds(f, 0, "IIRS") || holds(f, 0, "MMOR"); }},
    {{"a Panasonic raw photo (RW2)", develop},
     [](Bytes f) { return holds(f, 0, std::string_view("IIU\0", 4)); }},
    {{"an AVIF photo", "avifdec photo out.png"}, [](Bytes f) { return isOfBrand(f, avifBrands); }},
    {{"a HEIC photo", "heif-convert photo out.jpg"},
     [](Bytes f) { return isOfBrand(f, heicBrands); }},
    {{"a WebP picture", "dwebp photo -o out.png"},
     [](Bytes f) { return holds(f, 0, "RIFF") && holds(f, 8, "WEBP"); }},
    {{"a TIFF picture", convert}, isTiff},
    {{"a GIF picture", convert},
     [](Bytes f) { return holds(f, 0, "GIF87a") || holds(f, 0, "GIF89a"); }},
    {{"a BMP picture", convert},
     [](Bytes f) { return holds(f, 0, "BM") && holds(f, 6, std::string_view("\0\0\0\0", 4)); }},
}};

}  // namespace

const UnsupportedFormat* unsupportedFormatOf(Bytes file) {
  const auto found =
      std::find_if(rows.begin(), rows.end(), [&](const Row& row) { return row.recognises(file); });
  return found == rows.end() ? nullptr : &found->format;
}

}  // namespace pelorin::photo
