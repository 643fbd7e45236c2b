#include <algorithm>
#include <array>
#include <string>
#include <string_view>

#include "photo/jpeg/jpeg_picture_writer.h"

namespace pelorin::photo {
namespace {

constexpr std::size_t longestPayload = 65533;

bool startsWith(const MetadataSegment& segment, std::uint8_t marker, std::string_view name) {
  return segment.marker == marker && segment.payload.size() >= name.size() &&
         std::equal(name.begin(), name.end(), segment.payload.begin());
}

bool tellsTheFileFormat(const MetadataSegment& segment) {
  using namespace std::string_view_literals;
  return startsWith(segment, JPEG_APP0, "JFIF\0"sv) ||
         startsWith(segment, JPEG_APP0 + 1, "Exif\0"sv);
}

void checkSegment(const MetadataSegment& segment) {
  const bool isApp = segment.marker >= JPEG_APP0 && segment.marker <= JPEG_APP0 + 15;
  if (!isApp && segment.marker != JPEG_COM)
    throw PhotoError(PhotoError::Kind::invalidRequest, "metadata must be APPn or COM");
  if (segment.payload.size() > longestPayload) {
    throw PhotoError(PhotoError::Kind::invalidRequest,
                     "a metadata segment is over " + std::to_string(longestPayload) + " bytes");
  }
}

// More than most photos need; of the largest, what they may need.
std::size_t expectedSize(std::uint32_t width, std::uint32_t height) {
  if (width < 1 || height < 1 || width > JPEG_MAX_DIMENSION || height > JPEG_MAX_DIMENSION) {
    throw PhotoError(PhotoError::Kind::invalidRequest,
                     "a JPEG file cannot be " + std::to_string(width) + " x " +
                         std::to_string(height) + " pixels, only 1 to 65500 each way");
  }
  constexpr std::uint64_t most = 64 << 20;
  return static_cast<std::size_t>(std::min(std::uint64_t{width} * height / 2, most));
}

}  // namespace

JpegPictureWriter::JpegPictureWriter(std::uint32_t width, std::uint32_t height,
                                     const JpegMaking& making,
                                     std::span<const MetadataSegment> metadata, ByteStore* overflow)
    : writer_(expectedSize(width, height), overflow) {
  for (const MetadataSegment& segment : metadata) checkSegment(segment);
  jpeg_compress_struct& codec = writer_.codec();
  writer_.run([&] {
    codec.image_width = width;
    codec.image_height = height;
    codec.input_components = making.grey ? 1 : 4;
    codec.in_color_space = making.grey ? JCS_GRAYSCALE : JCS_EXT_RGBA;
    jpeg_set_defaults(&codec);
    jpeg_set_quality(&codec, making.quality, TRUE);
    if (!making.grey) {
      codec.comp_info[0].h_samp_factor = making.sampling.across;
      codec.comp_info[0].v_samp_factor = making.sampling.down;
    }
    if (making.progressive) jpeg_simple_progression(&codec);
    codec.write_JFIF_header = std::none_of(metadata.begin(), metadata.end(), tellsTheFileFormat);
    jpeg_start_compress(&codec, TRUE);
    for (const MetadataSegment& segment : metadata) {
      jpeg_write_marker(&codec, segment.marker, segment.payload.data(),
                        static_cast<unsigned>(segment.payload.size()));
    }
  });
}

void JpegPictureWriter::write(const std::uint8_t* pixels, std::uint32_t count) {
  jpeg_compress_struct& codec = writer_.codec();
  const JDIMENSION first = codec.next_scanline;
  const std::size_t rowSize =
      std::size_t{codec.image_width} * static_cast<unsigned>(codec.input_components);
  writer_.run([&] {
    std::array<JSAMPROW, 16> rows;
    while (codec.next_scanline < first + count) {
      const JDIMENSION some =
          std::min<JDIMENSION>(rows.size(), first + count - codec.next_scanline);
      for (JDIMENSION i = 0; i < some; ++i) {
        const std::size_t y = codec.next_scanline - first + i;
        rows[i] = const_cast<JSAMPROW>(pixels + y * rowSize);  // libjpeg only reads
      }
      jpeg_write_scanlines(&codec, rows.data(), some);
    }
  });
}

std::vector<std::uint8_t> JpegPictureWriter::finish() {
  writer_.run([this] { jpeg_finish_compress(&writer_.codec()); });
  return writer_.takeFile();
}

void insertSegments(std::vector<std::uint8_t>& file, std::span<const MetadataSegment> segments) {
  constexpr std::ptrdiff_t startMark = 2, jfifSegment = 18;
  std::vector<std::uint8_t> bytes;
  for (const MetadataSegment& segment : segments) {
    checkSegment(segment);
    const std::size_t length = segment.payload.size() + 2;
    bytes.insert(bytes.end(), {0xFF, segment.marker, static_cast<std::uint8_t>(length >> 8),
                               static_cast<std::uint8_t>(length)});
    bytes.insert(bytes.end(), segment.payload.begin(), segment.payload.end());
  }
  const bool keepsJfif = std::none_of(segments.begin(), segments.end(), tellsTheFileFormat);
  if (!keepsJfif) file.erase(file.begin() + startMark, file.begin() + startMark + jfifSegment);
  file.insert(file.begin() + startMark + (keepsJfif ? jfifSegment : 0), bytes.begin(), bytes.end());
}

std::vector<std::uint8_t> encodeJpeg(const std::uint8_t* rgba, std::uint32_t width,
                                     std::uint32_t height, int quality,
                                     std::span<const MetadataSegment> metadata, Chroma chroma) {
  const ChromaSampling sampling =
      chroma == Chroma::whole ? ChromaSampling{1, 1} : ChromaSampling{2, 2};
  JpegPictureWriter writer(width, height, {.quality = quality, .sampling = sampling}, metadata);
  writer.write(rgba, height);
  return writer.finish();
}

}  // namespace pelorin::photo
