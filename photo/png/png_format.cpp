#include "photo/png/png_format.h"

#include <png.h>
#include <zlib.h>

#include <algorithm>
#include <cstring>
#include <new>
#include <string>
#include <utility>

#include "image_processing/core/checked_size.h"
#include "photo/checked_pixels.h"
#include "photo/metadata/kept_metadata.h"
#include "photo/metadata/stated_facts.h"
#include "photo/photo_error.h"
#include "photo/png/png_chunks.h"
#include "photo/png/png_losses.h"
#include "photo/way_out.h"

namespace pelorin::photo {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;

constexpr std::uint32_t rowsBetweenStops = 256;

/// Turns libpng's errors into exceptions: an error goes back into `run`, and `run` throws.
class PngErrors {
 public:
  /// Calls `body`, which calls libpng, as `WayOut::left` does.
  template <typename Body>
  void run(const Body& body) {
    if (wayOut_.left(body)) throwError();
  }

  static void fail(png_structp png, png_const_charp message) {
    auto* errors = static_cast<PngErrors*>(png_get_error_ptr(png));
    std::strncpy(errors->message_, message, sizeof errors->message_ - 1);
    errors->wayOut_.take();
  }
  static void ignore(png_structp, png_const_charp) {}

  bool truncated = false;

 private:
  [[noreturn]] void throwError() const {
    if (std::strstr(message_, "emory") != nullptr) throw std::bad_alloc();
    if (truncated)
      throw PhotoError(PhotoError::Kind::truncated, "truncated: the picture data ends early");
    throw PhotoError(PhotoError::Kind::damaged, std::string("damaged: ") + message_);
  }

  WayOut wayOut_;
  char message_[200] = {};
};

/// A libpng reader over a file in memory.
class PngSource {
 public:
  explicit PngSource(std::span<const std::uint8_t> file) : rest_(file) {
    png_ =
        png_create_read_struct(PNG_LIBPNG_VER_STRING, &errors_, PngErrors::fail, PngErrors::ignore);
    if (png_ != nullptr) info_ = png_create_info_struct(png_);
    if (info_ == nullptr) {
      png_destroy_read_struct(&png_, nullptr, nullptr);
      throw std::bad_alloc();
    }
  }
  ~PngSource() { png_destroy_read_struct(&png_, &info_, nullptr); }
  PngSource(const PngSource&) = delete;
  PngSource& operator=(const PngSource&) = delete;

  png_structp png() { return png_; }
  png_infop info() { return info_; }

  template <typename Body>
  void run(const Body& body) {
    errors_.run(body);
  }

  /// Reads up to the picture data, of a picture of any size.
  void readHeader() {
    errors_.run([this] {
      png_set_read_fn(png_, this, take);
      png_set_user_limits(png_, PNG_UINT_31_MAX, PNG_UINT_31_MAX);
      png_set_crc_action(png_, PNG_CRC_ERROR_QUIT, PNG_CRC_ERROR_QUIT);
#ifdef PNG_HANDLE_AS_UNKNOWN_SUPPORTED
      // What stands beside the picture is read apart from it.
      png_set_keep_unknown_chunks(png_, PNG_HANDLE_CHUNK_NEVER, beside,
                                  sizeof beside / chunkNameSize);
#endif
      png_read_info(png_, info_);
    });
  }

 private:
  static constexpr int chunkNameSize = 5;
  static constexpr png_byte beside[] = "gAMA\0cHRM\0sRGB\0iCCP\0eXIf\0tEXt\0zTXt\0iTXt\0pHYs\0tIME";

  static void take(png_structp png, png_bytep bytes, std::size_t count) {
    auto* self = static_cast<PngSource*>(png_get_io_ptr(png));
    if (count > self->rest_.size()) {
      self->errors_.truncated = true;
      png_error(png, "ends early");
    }
    std::memcpy(bytes, self->rest_.data(), count);
    self->rest_ = self->rest_.subspan(count);
  }

  std::span<const std::uint8_t> rest_;
  PngErrors errors_;
  png_structp png_ = nullptr;
  png_infop info_ = nullptr;
};

int channelsOf(int colourType) {
  const bool alpha = (colourType & PNG_COLOR_MASK_ALPHA) != 0;
  return ((colourType & PNG_COLOR_MASK_COLOR) != 0 ? 3 : 1) + (alpha ? 1 : 0);
}

class PngRowReader : public RowReader {
 public:
  PngRowReader(std::span<const std::uint8_t> file, const OpenOptions& options)
      : stop_(options.stop), source_(file) {
    source_.readHeader();
    png_structp png = source_.png();
    png_infop info = source_.info();
    size_ = {png_get_image_width(png, info), png_get_image_height(png, info)};
    checkSize(options.limits, file.size());
    const int colourType = png_get_color_type(png, info);
    const int depth = png_get_bit_depth(png, info);
    const bool isColour = (colourType & PNG_COLOR_MASK_COLOR) != 0;
    const bool keyed = png_get_valid(png, info, PNG_INFO_tRNS) != 0;
    interlaced_ = png_get_interlace_type(png, info) != PNG_INTERLACE_NONE;

    facts_.format = pngFormat.name;
    facts_.width = size_.width;
    facts_.height = size_.height;
    facts_.channels = channelsOf(colourType);
    facts_.progressive = interlaced_;
    facts_.hasAlpha = (colourType & PNG_COLOR_MASK_ALPHA) != 0 || keyed;
    if (depth == 16) facts_.notices.push_back("has 16 bits a channel, read as 8");
    metadata_ = pngMetadata(file);
    addStatedFacts(metadata_.segments, facts_);
    metadata_.storedSize = size_;
    metadata_.orientation = facts_.orientation;

    source_.run([&] {
      if (depth == 16) png_set_scale_16(png);  // to the nearest
      png_set_expand(png);                     // palettes, few bits, a transparent colour
      if (!isColour) png_set_gray_to_rgb(png);
      if (!facts_.hasAlpha) png_set_filler(png, 255, PNG_FILLER_AFTER);
      passes_ = png_set_interlace_handling(png);
      png_read_update_info(png, info);
    });
    if (png_get_rowbytes(png, info) != std::size_t{size_.width} * sizeof(RGBA8Pixel)) {
      throw PhotoError(PhotoError::Kind::unsupported, "unsupported: an unknown kind of pixels");
    }
  }

  void read(RGBA8Pixel* rows, std::uint32_t count) override {
    if (count == 0) return;
    if (interlaced_ && count < size_.height) {
      copyRows(rows, count);
    } else {
      for (int pass = 0; pass < passes_; ++pass) decode(rows, count);
    }
    next_ += count;
    if (next_ == size_.height && !ended_) end();
  }

 private:
  void checkSize(const DecodeLimits& limits, std::size_t bytes) {
    checkPixels(size_, limits);
    // What asks for more than its bytes can become ends early, after memory was taken for all of it.
    constexpr std::uint64_t mostOfAByte = 1032;  // deflate's longest match, 258 bytes, takes 2 bits
    if (png_get_rowbytes(source_.png(), source_.info()) * std::uint64_t{size_.height} /
            mostOfAByte >
        bytes) {
      throw PhotoError(PhotoError::Kind::truncated, "truncated: the picture data ends early");
    }
    checkCompressedPixels(size_, bytes, limits);
  }

  void decode(RGBA8Pixel* rows, std::uint32_t count) {
    while (count > 0) {
      stopIfAsked(stop_);
      const std::uint32_t some = std::min(count, rowsBetweenStops);
      source_.run([&] {
        for (std::uint32_t y = 0; y < some; ++y) {
          RGBA8Pixel* row = rows + std::size_t{y} * size_.width;
          png_read_row(source_.png(), reinterpret_cast<png_bytep>(row), nullptr);
        }
      });
      rows += std::size_t{some} * size_.width;
      count -= some;
    }
  }

  // Every pass of an interlaced picture goes over all of it.
  void copyRows(RGBA8Pixel* rows, std::uint32_t count) {
    if (whole_.pixelCount() == 0) {
      whole_ = Image<RGBA8Pixel>(size_.width, size_.height);
      for (int pass = 0; pass < passes_; ++pass) decode(whole_.data.get(), size_.height);
      end();
    }
    std::copy_n(whole_.row(next_), std::size_t{size_.width} * count, rows);
  }

  void end() {
    source_.run([this] { png_read_end(source_.png(), nullptr); });
    ended_ = true;
  }

  std::stop_token stop_;
  PngSource source_;
  bool interlaced_ = false, ended_ = false;
  int passes_ = 1;
  std::uint32_t next_ = 0;
  Image<RGBA8Pixel> whole_{0, 0};
};

class PngRowWriter : public RowWriter {
 public:
  PngRowWriter(PictureSize size, bool hasAlpha, const SaveOptions& options)
      : stop_(options.stop),
        width_(size.width),
        greyRow_(options.colour == ColourDetail::none ? size.width : 0) {
    if (size.width < 1 || size.height < 1 || size.width > PNG_UINT_31_MAX ||
        size.height > PNG_UINT_31_MAX) {
      throw PhotoError(PhotoError::Kind::invalidRequest,
                       "a PNG file cannot be " + std::to_string(size.width) + " x " +
                           std::to_string(size.height) + " pixels");
    }
    file_.reserve(
        static_cast<std::size_t>(std::min(std::uint64_t{size.width} * size.height, mostReserved)));
    png_ = png_create_write_struct(PNG_LIBPNG_VER_STRING, &errors_, PngErrors::fail,
                                   PngErrors::ignore);
    if (png_ != nullptr) info_ = png_create_info_struct(png_);
    if (info_ == nullptr) {
      png_destroy_write_struct(&png_, nullptr);
      throw std::bad_alloc();
    }
    try {
      errors_.run([&] {
        png_set_write_fn(png_, this, append, [](png_structp) {});
        png_set_user_limits(png_, PNG_UINT_31_MAX, PNG_UINT_31_MAX);
        png_set_IHDR(png_, info_, size.width, size.height, 8,
                     isGrey()   ? PNG_COLOR_TYPE_GRAY
                     : hasAlpha ? PNG_COLOR_TYPE_RGB_ALPHA
                                : PNG_COLOR_TYPE_RGB,
                     PNG_INTERLACE_NONE, PNG_COMPRESSION_TYPE_DEFAULT, PNG_FILTER_TYPE_DEFAULT);
        png_write_info(png_, info_);
        if (!hasAlpha && !isGrey()) png_set_filler(png_, 0, PNG_FILLER_AFTER);
      });
    } catch (...) {
      png_destroy_write_struct(&png_, &info_);
      throw;
    }
  }
  ~PngRowWriter() override { png_destroy_write_struct(&png_, &info_); }
  PngRowWriter(const PngRowWriter&) = delete;
  PngRowWriter& operator=(const PngRowWriter&) = delete;

  void write(const RGBA8Pixel* rows, std::uint32_t count) override {
    while (count > 0) {
      stopIfAsked(stop_);
      const std::uint32_t some = std::min(count, rowsBetweenStops);
      errors_.run([&] {
        for (std::uint32_t y = 0; y < some; ++y) {
          const RGBA8Pixel* row = rows + std::size_t{y} * width_;
          png_write_row(png_, isGrey() ? greyOf(row) : reinterpret_cast<png_const_bytep>(row));
        }
      });
      rows += std::size_t{some} * width_;
      count -= some;
    }
  }

  bool isGrey() const override { return !greyRow_.empty(); }

  std::vector<std::uint8_t> finish(const KeptMetadata& kept) override {
    errors_.run([this] { png_write_end(png_, nullptr); });
    std::vector<std::uint8_t> chunks;
    for (const PngChunk& chunk : chunksOf(kept)) appendChunk(chunks, chunk);
    file_.insert(file_.begin() + headerSize, chunks.begin(), chunks.end());
    return std::move(file_);
  }

 private:
  png_const_bytep greyOf(const RGBA8Pixel* row) {
    std::transform(row, row + width_, greyRow_.begin(), [](const RGBA8Pixel& p) { return p.r; });
    return greyRow_.data();
  }

  static constexpr std::uint64_t mostReserved = 64 << 20;
  static constexpr std::ptrdiff_t headerSize = 8 + 25;  // the signature and IHDR

  static void appendNumber(std::vector<std::uint8_t>& bytes, std::uint64_t number) {
    for (const int shift : {24, 16, 8, 0})
      bytes.push_back(static_cast<std::uint8_t>(number >> shift));
  }

  static void appendChunk(std::vector<std::uint8_t>& bytes, const PngChunk& chunk) {
    appendNumber(bytes, chunk.data.size());
    const std::size_t checked = bytes.size();
    bytes.insert(bytes.end(), chunk.type.begin(), chunk.type.end());
    bytes.insert(bytes.end(), chunk.data.begin(), chunk.data.end());
    appendNumber(bytes,
                 crc32(0, bytes.data() + checked, static_cast<uInt>(bytes.size() - checked)));
  }

  static void append(png_structp png, png_bytep bytes, std::size_t count) {
    auto* self = static_cast<PngRowWriter*>(png_get_io_ptr(png));
    bool done = false;
    try {
      self->file_.insert(self->file_.end(), bytes, bytes + count);
      done = true;
    } catch (const std::exception&) {  // bad_alloc or length_error; neither may cross libpng
    }
    if (!done) png_error(png, "out of memory");
  }

  std::stop_token stop_;
  std::uint32_t width_;
  std::vector<std::uint8_t> greyRow_;  // empty unless the file is grey
  std::vector<std::uint8_t> file_;
  PngErrors errors_;
  png_structp png_ = nullptr;
  png_infop info_ = nullptr;
};

constexpr std::string_view extensions[] = {".png"};

}  // namespace

constinit const Format pngFormat = {
    .name = "PNG",
    .extensions = extensions,
    .scalesWhileDecoding = false,
    .keepsAlpha = true,
    .losesDetail = false,
    .recognises =
        [](std::span<const std::uint8_t> file) {
          constexpr std::size_t signatureSize = 8;
          return file.size() >= signatureSize && png_sig_cmp(file.data(), 0, signatureSize) == 0;
        },
    .mayBePart = [](std::span<const std::uint8_t>) { return false; },
    .reader = [](const FileView& file, const OpenOptions& options) -> std::unique_ptr<RowReader> {
      return std::make_unique<PngRowReader>(file.bytes, options);
    },
    .removeForeign = removeWhatPngLacks,
    .writer = [](PictureSize size, bool hasAlpha, const SaveOptions& options,
                 const Metadata&) -> std::unique_ptr<RowWriter> {
      return std::make_unique<PngRowWriter>(size, hasAlpha, options);
    },
};

}  // namespace pelorin::photo
