#include "photo/jpeg/jpeg_format.h"

#include <algorithm>
#include <utility>

#include "photo/jpeg/jpeg_end.h"
#include "photo/jpeg/jpeg_picture_reader.h"
#include "photo/jpeg/jpeg_picture_writer.h"
#include "photo/metadata/kept_metadata.h"
#include "photo/metadata/stated_facts.h"

namespace pelorin::photo {
namespace {

using image_processing::RGBA8Pixel;

constexpr std::uint32_t rowsBetweenStops = 256;

class JpegRowReader : public RowReader {
 public:
  JpegRowReader(std::span<const std::uint8_t> file, const OpenOptions& options)
      : stop_(options.stop),
        picture_(file, options.scale, options.limits, JpegPictureReader::Keep::everySegment) {
    JpegHeader header = picture_.header();
    size_ = {picture_.width(), picture_.height()};
    facts_.format = jpegFormat.name;
    facts_.width = header.width;
    facts_.height = header.height;
    facts_.channels = header.components;
    facts_.progressive = header.progressive;
    addStatedFacts(header.metadata, facts_);
    if (header.components == 4) facts_.notices.push_back("is CMYK, converted to sRGB");
    // A profile for grey or CMYK does not describe RGB.
    if (header.components != 3) {
      const std::size_t before = header.metadata.size();
      removeColourProfile(header.metadata);
      if (header.components == 1 && header.metadata.size() < before)
        facts_.notices.push_back("has a colour profile for grey, which the result cannot keep");
    }
    const auto tail = file.subspan(jpegEnd(file));
    metadata_ = {.segments = std::move(header.metadata),
                 .tail = {tail.begin(), tail.end()},
                 .storedSize = {facts_.width, facts_.height},
                 .orientation = facts_.orientation};
  }

  void read(RGBA8Pixel* rows, std::uint32_t count) override {
    while (count > 0) {
      stopIfAsked(stop_);
      const std::uint32_t some = std::min(count, rowsBetweenStops);
      picture_.read(reinterpret_cast<std::uint8_t*>(rows), some);
      rows += std::size_t{some} * size_.width;
      count -= some;
    }
  }

 private:
  std::stop_token stop_;
  JpegPictureReader picture_;
};

void removeForeign(KeptMetadata& kept) {
  constexpr std::size_t longest = 65533;
  if (std::erase_if(kept.segments,
                    [](const MetadataSegment& s) { return s.payload.size() > longest; }) > 0)
    kept.lost.push_back({"metadata above 64 KB", "a JPEG file has no room for it"});
  if (!kept.chunks.empty())
    kept.lost.push_back({"texts and other parts of the PNG file", "a JPEG file has none"});
  kept.chunks.clear();
}

class JpegRowWriter : public RowWriter {
 public:
  JpegRowWriter(PictureSize size, const SaveOptions& options)
      : stop_(options.stop),
        width_(size.width),
        picture_(size.width, size.height, options.quality, {},
                 options.colour == ColourDetail::full ? Chroma::whole : Chroma::halved) {}

  void write(const RGBA8Pixel* rows, std::uint32_t count) override {
    while (count > 0) {
      stopIfAsked(stop_);
      const std::uint32_t some = std::min(count, rowsBetweenStops);
      picture_.write(reinterpret_cast<const std::uint8_t*>(rows), some);
      rows += std::size_t{some} * width_;
      count -= some;
    }
  }

  std::vector<std::uint8_t> finish(const KeptMetadata& kept) override {
    std::vector<std::uint8_t> file = picture_.finish();
    insertSegments(file, kept.segments);
    appendTail(file, kept.tail);
    return file;
  }

 private:
  std::stop_token stop_;
  std::uint32_t width_;
  JpegPictureWriter picture_;
};

constexpr std::string_view extensions[] = {".jpg", ".jpeg", ".jpe"};

}  // namespace

constinit const Format jpegFormat = {
    .name = "JPEG",
    .extensions = extensions,
    .scalesWhileDecoding = true,
    .keepsAlpha = false,
    .losesDetail = true,
    .recognises =
        [](std::span<const std::uint8_t> file) {
          return file.size() >= 2 && file[0] == 0xFF && file[1] == 0xD8;
        },
    .reader = [](std::span<const std::uint8_t> file, const OpenOptions& options)
        -> std::unique_ptr<RowReader> { return std::make_unique<JpegRowReader>(file, options); },
    .removeForeign = removeForeign,
    .writer = [](PictureSize size, bool, const SaveOptions& options) -> std::unique_ptr<RowWriter> {
      return std::make_unique<JpegRowWriter>(size, options);
    },
};

}  // namespace pelorin::photo
