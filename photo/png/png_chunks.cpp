#include "photo/png/png_chunks.h"

#include <zlib.h>

#include <algorithm>
#include <array>
#include <string_view>

#include "photo/metadata/exif_orientation.h"
#include "photo/metadata/segments.h"
#include "photo/photo_error.h"

namespace pelorin::photo {
namespace {

using Bytes = std::span<const std::uint8_t>;

constexpr std::uint8_t app1 = 0xE1, comment = 0xFE;
constexpr std::string_view xmpKeyword("XML:com.adobe.xmp\0", 18);
constexpr std::size_t signatureSize = 8;

// Kept as they are. What tells how the pixels were stored, or when the file was changed, is not.
constexpr std::array<std::string_view, 7> keptTypes = {"gAMA", "cHRM", "sRGB", "pHYs",
                                                       "tEXt", "zTXt", "iTXt"};

std::uint32_t read32(Bytes bytes, std::size_t at) {
  return std::uint32_t{bytes[at]} << 24 | std::uint32_t{bytes[at + 1]} << 16 |
         std::uint32_t{bytes[at + 2]} << 8 | bytes[at + 3];
}

std::string_view textOf(Bytes bytes) {
  return {reinterpret_cast<const char*>(bytes.data()), bytes.size()};
}

[[noreturn]] void failTruncated() {
  throw PhotoError(PhotoError::Kind::truncated, "truncated: the file ends early");
}

// Unpacked bytes; a size beyond any that exists counts as damage.
std::vector<std::uint8_t> inflated(Bytes packed, std::string_view what) {
  constexpr std::size_t largest = std::size_t{16} << 20;
  constexpr std::size_t smallest = 4096;
  std::vector<std::uint8_t> bytes(std::max(std::min(packed.size(), largest / 4) * 4, smallest));
  for (;;) {
    uLongf size = bytes.size();
    const int code = uncompress(bytes.data(), &size, packed.data(), packed.size());
    if (code == Z_OK) {
      bytes.resize(size);
      return bytes;
    }
    if (code == Z_MEM_ERROR) throw std::bad_alloc();
    if (code != Z_BUF_ERROR || bytes.size() >= largest) {
      throw PhotoError(PhotoError::Kind::damaged,
                       "damaged: its " + std::string(what) + " cannot be unpacked");
    }
    bytes.resize(std::min(bytes.size() * 2, largest));
  }
}

std::vector<std::uint8_t> deflated(Bytes bytes) {
  uLongf size = compressBound(bytes.size());
  std::vector<std::uint8_t> packed(size);
  if (compress(packed.data(), &size, bytes.data(), bytes.size()) != Z_OK) throw std::bad_alloc();
  packed.resize(size);
  return packed;
}

void addProfile(Bytes data, Metadata& metadata) {
  const auto end = std::find(data.begin(), data.end(), 0);
  const std::size_t name = static_cast<std::size_t>(end - data.begin());
  if (name + 2 >= data.size() || data[name + 1] != 0) {
    throw PhotoError(PhotoError::Kind::damaged, "damaged: its colour profile cannot be read");
  }
  addColourProfile(inflated(data.subspan(name + 2), "colour profile"), metadata.segments);
}

// The XMP packet in an iTXt chunk; empty when it is another text or cut off.
std::vector<std::uint8_t> xmpOf(Bytes data) {
  const std::string_view text = textOf(data);
  const std::size_t flags = xmpKeyword.size();
  if (!text.starts_with(xmpKeyword) || text.size() < flags + 2) return {};
  // Packed or not, how, then the language and the keyword in it.
  const std::size_t language = text.find('\0', flags + 2);
  const std::size_t keyword =
      language == std::string_view::npos ? language : text.find('\0', language + 1);
  if (keyword == std::string_view::npos) return {};
  const Bytes packet = data.subspan(keyword + 1);
  if (data[flags] != 0) return inflated(packet, "XMP");
  return {packet.begin(), packet.end()};
}

void addChunk(std::string_view type, Bytes data, Metadata& metadata) {
  if (type == "eXIf") {
    // Some writers put a segment's mark in front.
    const bool marked = isExif(data);
    metadata.segments.push_back(segmentOf(app1, marked ? std::string_view{} : exifMark, data));
  } else if (type == "iCCP") {
    addProfile(data, metadata);
  } else if (const auto xmp = type == "iTXt" ? xmpOf(data) : std::vector<std::uint8_t>();
             !xmp.empty()) {
    metadata.segments.push_back(segmentOf(app1, xmpMark, xmp));
  } else if (std::find(keptTypes.begin(), keptTypes.end(), type) != keptTypes.end()) {
    metadata.chunks.push_back({std::string(type), {data.begin(), data.end()}});
  }
}

PngChunk chunkOf(std::string_view type, std::string_view head, Bytes content) {
  PngChunk chunk{std::string(type), {head.begin(), head.end()}};
  chunk.data.insert(chunk.data.end(), content.begin(), content.end());
  return chunk;
}

}  // namespace

Metadata pngMetadata(Bytes file) {
  constexpr std::size_t around = 12;  // length, type and checksum
  Metadata metadata;
  for (std::size_t at = signatureSize;;) {
    if (file.size() < at + around) failTruncated();
    const std::size_t length = read32(file, at);
    if (file.size() - at - around < length) failTruncated();
    const std::string_view type = textOf(file.subspan(at + 4, 4));
    if (type == "IEND") return metadata;
    const bool matters =
        type != "IDAT" && (type == "eXIf" || type == "iCCP" ||
                           std::find(keptTypes.begin(), keptTypes.end(), type) != keptTypes.end());
    if (matters) {
      const Bytes checked = file.subspan(at + 4, length + 4);
      if (crc32(0, checked.data(), static_cast<uInt>(checked.size())) !=
          read32(file, at + 8 + length)) {
        throw PhotoError(PhotoError::Kind::damaged,
                         "damaged: the checksum of " + std::string(type) + " is wrong");
      }
      addChunk(type, checked.subspan(4), metadata);
    }
    at += around + length;
  }
}

std::vector<PngChunk> chunksOf(const KeptMetadata& metadata) {
  std::vector<PngChunk> chunks;
  if (const auto profile = colourProfileOf(metadata.segments); !profile.empty()) {
    constexpr std::string_view name("ICC profile\0\0", 13);
    chunks.push_back(chunkOf("iCCP", name, deflated(profile)));
  }
  // A profile says what these two would, and a file may have only one of them.
  const bool hasProfile = !chunks.empty();
  for (const PngChunk& chunk : metadata.chunks) {
    if (!hasProfile || chunk.type != "sRGB") chunks.push_back(chunk);
  }
  if (const Bytes exif = contentOf(metadata.segments, app1, exifMark); !exif.empty())
    chunks.push_back(chunkOf("eXIf", "", exif));
  if (const Bytes xmp = contentOf(metadata.segments, app1, xmpMark); !xmp.empty())
    chunks.push_back(chunkOf("iTXt", std::string(xmpKeyword) + std::string(4, '\0'), xmp));
  for (const MetadataSegment& segment : metadata.segments) {
    if (segment.marker == comment)
      chunks.push_back(chunkOf("tEXt", std::string_view("Comment\0", 8), segment.payload));
  }
  return chunks;
}

}  // namespace pelorin::photo
