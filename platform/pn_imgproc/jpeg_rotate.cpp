#include <algorithm>
#include <array>
#include <numeric>
#include <span>
#include <string>
#include <utility>

#include "platform/pn_imgproc/jpeg_codec.h"
#include "platform/pn_imgproc/jpeg_limits.h"
#include "platform/pn_imgproc/libjpeg_reader.h"
#include "platform/pn_imgproc/libjpeg_writer.h"

namespace pelorin::imgproc {
namespace {

/// What becomes of a picture: the order of its rows and of its columns is reversed, then they are
/// exchanged.
struct Turn {
  bool reversesRows, reversesColumns, swapsAxes;
};

Turn turnBy(int degrees) {
  switch ((degrees % 360 + 360) % 360) {
    case 0:
      return {false, false, false};
    case 90:
      return {true, false, true};
    case 180:
      return {true, true, false};
    case 270:
      return {false, true, true};
    default:
      throw JpegError("a JPEG file turns by multiples of 90 degrees, not by " +
                      std::to_string(degrees));
  }
}

/// What becomes of a block of cosine coefficients. A cosine of odd frequency changes its sign when
/// its direction is reversed, one of even frequency stays; exchanged axes exchange frequencies.
struct BlockTurn {
  explicit BlockTurn(const Turn& turn) {
    for (int i = 0; i < DCTSIZE2; ++i) {
      int row = i / DCTSIZE, column = i % DCTSIZE;
      if (turn.swapsAxes) std::swap(row, column);
      const bool rowNegates = turn.reversesRows && row % 2 != 0;
      const bool columnNegates = turn.reversesColumns && column % 2 != 0;
      source[i] = row * DCTSIZE + column;
      sign[i] = rowNegates != columnNegates ? -1 : 1;
    }
  }

  void operator()(const JBLOCK& from, JBLOCK& to) const {
    for (int i = 0; i < DCTSIZE2; ++i) to[i] = static_cast<JCOEF>(from[source[i]] * sign[i]);
  }

  void operator()(JQUANT_TBL& table) const {
    const JQUANT_TBL before = table;
    for (int i = 0; i < DCTSIZE2; ++i) table.quantval[i] = before.quantval[source[i]];
  }

  std::array<int, DCTSIZE2> source, sign;
};

std::span<jpeg_component_info> channelsOf(jpeg_compress_struct& codec) {
  return {codec.comp_info, static_cast<std::size_t>(codec.num_components)};
}

// Only the ratio of sampling factors tells anything, and the smaller they are, the less is trimmed.
void reduceSampling(jpeg_compress_struct& codec) {
  int across = 0, down = 0;
  for (const jpeg_component_info& channel : channelsOf(codec)) {
    across = std::gcd(across, channel.h_samp_factor);
    down = std::gcd(down, channel.v_samp_factor);
  }
  for (jpeg_component_info& channel : channelsOf(codec)) {
    channel.h_samp_factor /= across;
    channel.v_samp_factor /= down;
  }
}

// The last block comes first in a reversed direction, where it has to be whole in every channel.
void trim(JDIMENSION& side, bool& reverses, int samplingFactor) {
  const JDIMENSION unit = DCTSIZE * static_cast<JDIMENSION>(samplingFactor);
  const JDIMENSION whole = side / unit * unit;
  reverses = reverses && whole > 0;
  if (reverses) side = whole;
}

// From the parameters of the picture as it was to those of the turned one.
void turnParameters(jpeg_compress_struct& codec, Turn& turn) {
  reduceSampling(codec);
  int across = 1, down = 1;
  for (const jpeg_component_info& channel : channelsOf(codec)) {
    across = std::max(across, channel.h_samp_factor);
    down = std::max(down, channel.v_samp_factor);
  }
  trim(codec.image_width, turn.reversesColumns, across);
  trim(codec.image_height, turn.reversesRows, down);
  if (!turn.swapsAxes) return;
  std::swap(codec.image_width, codec.image_height);
  for (jpeg_component_info& channel : channelsOf(codec))
    std::swap(channel.h_samp_factor, channel.v_samp_factor);
}

void turnTables(jpeg_compress_struct& codec, const Turn& turn) {
  const BlockTurn turnBlock(turn);
  for (JQUANT_TBL* table : codec.quant_tbl_ptrs) {
    if (table != nullptr) turnBlock(*table);
  }
}

// Room for the blocks of a turned channel; trimming leaves some of it unused.
jvirt_barray_ptr requestBlocks(jpeg_compress_struct& codec, const jpeg_component_info& channel,
                               const jpeg_component_info& before, const Turn& turn) {
  const auto padded = [](JDIMENSION blocks, int samplingFactor) {
    const auto unit = static_cast<JDIMENSION>(samplingFactor);
    return (blocks + unit - 1) / unit * unit;
  };
  JDIMENSION across = padded(before.width_in_blocks, before.h_samp_factor);
  JDIMENSION down = padded(before.height_in_blocks, before.v_samp_factor);
  if (turn.swapsAxes) std::swap(across, down);
  return codec.mem->request_virt_barray(reinterpret_cast<j_common_ptr>(&codec), JPOOL_IMAGE,
                                        /*pre_zero=*/TRUE, across, down,
                                        static_cast<JDIMENSION>(channel.v_samp_factor));
}

JBLOCKROW blockRow(auto& codec, jvirt_barray_ptr blocks, JDIMENSION row, bool writes) {
  return *codec.mem->access_virt_barray(reinterpret_cast<j_common_ptr>(&codec), blocks, row, 1,
                                        writes);
}

void turnBlocks(jpeg_decompress_struct& source, jvirt_barray_ptr before,
                jpeg_compress_struct& target, jvirt_barray_ptr after,
                const jpeg_component_info& channel, const Turn& turn) {
  const BlockTurn turnBlock(turn);
  JDIMENSION rows = channel.height_in_blocks, columns = channel.width_in_blocks;
  if (turn.swapsAxes) std::swap(rows, columns);
  for (JDIMENSION y = 0; y < channel.height_in_blocks; ++y) {
    const JBLOCKROW turned = blockRow(target, after, y, true);
    for (JDIMENSION x = 0; x < channel.width_in_blocks; ++x) {
      JDIMENSION row = y, column = x;
      if (turn.swapsAxes) std::swap(row, column);
      if (turn.reversesRows) row = rows - 1 - row;
      if (turn.reversesColumns) column = columns - 1 - column;
      turnBlock(blockRow(source, before, row, false)[column], turned[x]);
    }
  }
}

}  // namespace

std::vector<std::uint8_t> rotateJpeg(std::span<const std::uint8_t> file, int degrees,
                                     const DecodeLimits& limits) {
  Turn turn = turnBy(degrees);
  LibjpegReader reader(file);
  reader.keepAllSegments();
  reader.readHeader();
  checkLimits(reader, limits);
  jpeg_decompress_struct& source = reader.codec();
  jvirt_barray_ptr* before = nullptr;
  reader.run([&] { before = jpeg_read_coefficients(&source); });
  reader.checkEveryChannelCame();
  if (degrees % 360 == 0) return {file.begin(), file.end()};

  LibjpegWriter writer(file.size());
  jpeg_compress_struct& target = writer.codec();
  std::array<jvirt_barray_ptr, MAX_COMPONENTS> after;
  // One within the other, so that errors of either codec have where to land.
  reader.run([&] {
    writer.run([&] {
      jpeg_copy_critical_parameters(&source, &target);
      turnParameters(target, turn);
      turnTables(target, turn);
      for (int i = 0; i < target.num_components; ++i)
        after[i] = requestBlocks(target, target.comp_info[i], source.comp_info[i], turn);
      if (source.progressive_mode) jpeg_simple_progression(&target);
      // They come with the other segments.
      target.write_JFIF_header = target.write_Adobe_marker = FALSE;
      jpeg_write_coefficients(&target, after.data());
      for (auto segment = source.marker_list; segment != nullptr; segment = segment->next)
        jpeg_write_marker(&target, segment->marker, segment->data, segment->data_length);
      for (int i = 0; i < target.num_components; ++i)
        turnBlocks(source, before[i], target, after[i], target.comp_info[i], turn);
      jpeg_finish_compress(&target);
    });
  });
  return writer.takeFile();
}

}  // namespace pelorin::imgproc
