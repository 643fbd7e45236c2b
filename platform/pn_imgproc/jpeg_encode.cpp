#include <jerror.h>

#include <algorithm>
#include <array>
#include <new>
#include <string>
#include <string_view>

#include "platform/pn_imgproc/jpeg_codec.h"
#include "platform/pn_imgproc/libjpeg_errors.h"

namespace pelorin::imgproc {
namespace {

constexpr std::size_t longestPayload = 65533;

class LibjpegWriter {
 public:
  LibjpegWriter() {
    codec_.err = errors_.manager();
    try {
      run([this] { jpeg_create_compress(&codec_); });
    } catch (...) {
      jpeg_destroy_compress(&codec_);  // half of it may be there
      throw;
    }
  }
  ~LibjpegWriter() { jpeg_destroy_compress(&codec_); }
  LibjpegWriter(const LibjpegWriter&) = delete;
  LibjpegWriter& operator=(const LibjpegWriter&) = delete;

  jpeg_compress_struct& codec() { return codec_; }

  template <typename Body>
  void run(const Body& body) {
    errors_.run(body);
  }

 private:
  LibjpegErrors errors_;
  jpeg_compress_struct codec_ = {};
};

// Lets libjpeg write into a vector that doubles when it is full.
struct VectorDestination {
  jpeg_destination_mgr base;  // first, so that libjpeg's pointer to it is one to the whole
  std::vector<std::uint8_t>* bytes;
  std::size_t firstSize;

  static VectorDestination& of(j_compress_ptr codec) {
    return *reinterpret_cast<VectorDestination*>(codec->dest);
  }

  bool grow() {
    const std::size_t used = bytes->size();
    try {
      bytes->resize(std::max(firstSize, used * 2));
    } catch (const std::exception&) {  // bad_alloc or length_error; neither may cross libjpeg
      return false;
    }
    base.next_output_byte = bytes->data() + used;
    base.free_in_buffer = bytes->size() - used;
    return true;
  }

  static void begin(j_compress_ptr codec) {
    if (!of(codec).grow()) ERREXIT1(codec, JERR_OUT_OF_MEMORY, 0);
  }
  static boolean makeRoom(j_compress_ptr codec) {
    begin(codec);
    return TRUE;
  }
  static void end(j_compress_ptr codec) {
    VectorDestination& self = of(codec);
    self.bytes->resize(self.bytes->size() - self.base.free_in_buffer);
  }
};

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
  if (!isApp && segment.marker != JPEG_COM) throw JpegError("metadata must be APPn or COM");
  if (segment.payload.size() > longestPayload) {
    throw JpegError("a metadata segment is over " + std::to_string(longestPayload) + " bytes");
  }
}

// Within `run`.
void writeRows(jpeg_compress_struct& codec, const std::uint8_t* rgba) {
  std::array<JSAMPROW, 16> rows;
  while (codec.next_scanline < codec.image_height) {
    const JDIMENSION count =
        std::min<JDIMENSION>(rows.size(), codec.image_height - codec.next_scanline);
    for (JDIMENSION i = 0; i < count; ++i) {
      const std::size_t y = codec.next_scanline + i;
      rows[i] = const_cast<JSAMPROW>(rgba + y * codec.image_width * 4);  // libjpeg only reads
    }
    jpeg_write_scanlines(&codec, rows.data(), count);
  }
}

}  // namespace

std::vector<std::uint8_t> encodeJpeg(const std::uint8_t* rgba, std::uint32_t width,
                                     std::uint32_t height, int quality,
                                     std::span<const MetadataSegment> metadata) {
  if (width < 1 || height < 1 || width > JPEG_MAX_DIMENSION || height > JPEG_MAX_DIMENSION) {
    throw JpegError("a JPEG file cannot be " + std::to_string(width) + " x " +
                    std::to_string(height) + " pixels, only 1 to 65500 each way");
  }
  for (const MetadataSegment& segment : metadata) checkSegment(segment);

  std::vector<std::uint8_t> file;
  LibjpegWriter writer;
  jpeg_compress_struct& codec = writer.codec();
  VectorDestination destination = {};
  destination.base.init_destination = VectorDestination::begin;
  destination.base.empty_output_buffer = VectorDestination::makeRoom;
  destination.base.term_destination = VectorDestination::end;
  destination.bytes = &file;
  destination.firstSize = 65536 + std::size_t{width} * height / 4;  // most photos fit at once
  codec.dest = &destination.base;

  writer.run([&] {
    codec.image_width = width;
    codec.image_height = height;
    codec.input_components = 4;
    codec.in_color_space = JCS_EXT_RGBA;
    jpeg_set_defaults(&codec);
    jpeg_set_quality(&codec, quality, TRUE);
    codec.write_JFIF_header = std::none_of(metadata.begin(), metadata.end(), tellsTheFileFormat);
    jpeg_start_compress(&codec, TRUE);
    for (const MetadataSegment& segment : metadata) {
      jpeg_write_marker(&codec, segment.marker, segment.payload.data(),
                        static_cast<unsigned>(segment.payload.size()));
    }
    writeRows(codec, rgba);
    jpeg_finish_compress(&codec);
  });
  return file;
}

}  // namespace pelorin::imgproc
