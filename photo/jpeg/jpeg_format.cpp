#include "photo/jpeg/jpeg_format.h"

#include <algorithm>
#include <optional>
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
  JpegRowReader(const FileView& file, const OpenOptions& options)
      : stop_(options.stop),
        picture_(file, options.scale, options.limits, JpegPictureReader::Keep::everySegment) {
    JpegHeader header = picture_.header();
    size_ = {picture_.width(), picture_.height()};
    facts_.format = jpegFormat.name;
    facts_.width = header.width;
    facts_.height = header.height;
    facts_.channels = header.components;
    facts_.progressive = header.coding.progressive;
    addStatedFacts(header.metadata, facts_);
    if (header.components == 4) {
      facts_.notices.push_back("is CMYK, converted to sRGB");
      removeColourProfile(header.metadata);
    }
    const std::uint64_t end = jpegEndIn(file);
    std::vector<std::uint8_t> tail(static_cast<std::size_t>(file.size() - end));
    readFrom(file, end, tail);
    metadata_ = {.segments = std::move(header.metadata),
                 .tail = std::move(tail),
                 .storedSize = {facts_.width, facts_.height},
                 .orientation = facts_.orientation,
                 .coding = std::move(header.coding)};
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

ChromaSampling samplingFor(const SaveOptions& options, const Metadata& source) {
  if (options.sampling) return *options.sampling;
  if (options.colour == ColourDetail::full) return {1, 1};
  if (!source.coding || !source.coding->sampling) return {};
  const ChromaSampling stored = *source.coding->sampling;
  return source.turn.swapsAxes() ? ChromaSampling{stored.down, stored.across} : stored;
}

JpegMaking makingFor(const SaveOptions& options, const Metadata& source) {
  JpegMaking making = {.quality = options.quality, .sampling = samplingFor(options, source)};
  if (options.quality == sourceQuality)
    making.quality = (source.coding ? estimatedQuality(*source.coding) : std::nullopt).value_or(90);
  if (source.coding) making.progressive = source.coding->progressive;
  return making;
}

// Tables and rounding of auto-enhance leave up to 5 levels between the channels of a grey pixel.
bool areGrey(const RGBA8Pixel* pixels, std::size_t count) {
  return std::all_of(pixels, pixels + count, [](const RGBA8Pixel& p) {
    constexpr int rounding = 6;
    return std::max({p.r, p.g, p.b}) - std::min({p.r, p.g, p.b}) <= rounding;
  });
}

// What the encoder makes of colours, in its own numbers.
std::uint8_t brightness(const RGBA8Pixel& p) {
  return static_cast<std::uint8_t>((19595u * p.r + 38470u * p.g + 7471u * p.b + 32768u) >> 16);
}

class JpegRowWriter : public RowWriter {
 public:
  JpegRowWriter(PictureSize size, const SaveOptions& options, const Metadata& source)
      : stop_(options.stop), width_(size.width) {
    constexpr std::span<const MetadataSegment> noSegments;
    JpegMaking making = makingFor(options, source);
    const bool isGrey = source.coding && source.coding->grey;
    // Where two files are made, or an index tells where what is appended stands, all is in memory.
    const bool mayBeParted = !isGrey && source.tail.empty();
    picture_.emplace(size.width, size.height, making, noSegments,
                     mayBeParted ? options.overflow : nullptr);
    if (!isGrey) return;
    // Whether it will do is known behind the last row.
    making.grey = true;
    grey_.emplace(size.width, size.height, making, noSegments);
  }

  void write(const RGBA8Pixel* rows, std::uint32_t count) override {
    while (count > 0) {
      stopIfAsked(stop_);
      const std::uint32_t some = std::min(count, rowsBetweenStops);
      picture_->write(reinterpret_cast<const std::uint8_t*>(rows), some);
      if (grey_) writeGrey(rows, some);
      rows += std::size_t{some} * width_;
      count -= some;
    }
  }

  bool isGrey() const override { return grey_.has_value(); }

  std::vector<std::uint8_t> finish(const KeptMetadata& kept) override {
    std::vector<std::uint8_t> file = grey_ ? grey_->finish() : picture_->finish();
    insertSegments(file, kept.segments);
    appendTail(file, kept.tail);
    return file;
  }

 private:
  void writeGrey(const RGBA8Pixel* rows, std::uint32_t count) {
    const std::size_t pixels = std::size_t{count} * width_;
    if (!areGrey(rows, pixels)) return grey_.reset();
    std::vector<std::uint8_t> grey(pixels);
    std::transform(rows, rows + pixels, grey.begin(), brightness);
    grey_->write(grey.data(), count);
  }

  std::stop_token stop_;
  std::uint32_t width_;
  std::optional<JpegPictureWriter> picture_;
  std::optional<JpegPictureWriter> grey_;  // of a grey photo, as long as no row has colour
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
    .mayBePart = beginsPlainJpeg,
    .reader = [](const FileView& file, const OpenOptions& options) -> std::unique_ptr<RowReader> {
      return std::make_unique<JpegRowReader>(file, options);
    },
    .removeForeign = removeForeign,
    .writer = [](PictureSize size, bool, const SaveOptions& options,
                 const Metadata& source) -> std::unique_ptr<RowWriter> {
      return std::make_unique<JpegRowWriter>(size, options, source);
    },
};

}  // namespace pelorin::photo
