#include <algorithm>
#include <array>
#include <numeric>
#include <string>

#include "photo/file_size.h"
#include "photo/jpeg/jpeg_codec.h"
#include "photo/jpeg/jpeg_limits.h"
#include "photo/jpeg/jpeg_turn_pixels.h"
#include "photo/jpeg/libjpeg_reader.h"
#include "photo/jpeg/libjpeg_writer.h"

namespace pelorin::photo {
namespace {

Turn turnBy(int degrees) {
  if (degrees % 90 != 0) {
    throw PhotoError(
        PhotoError::Kind::invalidRequest,
        "a JPEG file turns by multiples of 90 degrees, not by " + std::to_string(degrees));
  }
  return turnedFurther({}, degrees);
}

/// What becomes of a block of cosine coefficients. A cosine of odd frequency changes its sign when
/// its direction is reversed, one of even frequency stays; exchanged axes exchange frequencies.
struct BlockTurn {
  explicit BlockTurn(const Turn& turn) {
    for (int i = 0; i < DCTSIZE2; ++i) {
      int row = i / DCTSIZE, column = i % DCTSIZE;
      if (turn.swapsAxes()) std::swap(row, column);
      const bool rowNegates = turn.reversesRows() && row % 2 != 0;
      const bool columnNegates = turn.reversesColumns() && column % 2 != 0;
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

/// Sampling factors of all channels: what they have in common, which tells nothing, and the largest
/// without that, which is the size, in blocks, of a unit that is whole in every channel.
struct Sampling {
  explicit Sampling(const jpeg_decompress_struct& codec) {
    for (int i = 0; i < codec.num_components; ++i) {
      commonAcross = std::gcd(commonAcross, codec.comp_info[i].h_samp_factor);
      commonDown = std::gcd(commonDown, codec.comp_info[i].v_samp_factor);
    }
    unitWidth = static_cast<JDIMENSION>(codec.max_h_samp_factor / commonAcross) * DCTSIZE;
    unitHeight = static_cast<JDIMENSION>(codec.max_v_samp_factor / commonDown) * DCTSIZE;
  }

  int commonAcross = 0, commonDown = 0;
  JDIMENSION unitWidth, unitHeight;
};

// From the parameters of the picture as it was to those of the turned one. The last unit comes
// first in a reversed direction, and there it has to be whole.
void turnParameters(jpeg_compress_struct& codec, const Sampling& sampling, const Turn& turn) {
  if (turn.reversesColumns()) codec.image_width -= codec.image_width % sampling.unitWidth;
  if (turn.reversesRows()) codec.image_height -= codec.image_height % sampling.unitHeight;
  if (turn.swapsAxes()) std::swap(codec.image_width, codec.image_height);
  for (int i = 0; i < codec.num_components; ++i) {
    jpeg_component_info& channel = codec.comp_info[i];
    channel.h_samp_factor /= sampling.commonAcross;
    channel.v_samp_factor /= sampling.commonDown;
    if (turn.swapsAxes()) std::swap(channel.h_samp_factor, channel.v_samp_factor);
  }
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
  if (turn.swapsAxes()) std::swap(across, down);
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
  if (turn.swapsAxes()) std::swap(rows, columns);
  for (JDIMENSION y = 0; y < channel.height_in_blocks; ++y) {
    const JBLOCKROW turned = blockRow(target, after, y, true);
    for (JDIMENSION x = 0; x < channel.width_in_blocks; ++x) {
      const Turn::Place from = turn.sourceOf({y, x}, rows, columns);
      turnBlock(blockRow(source, before, from.row, false)[from.column], turned[x]);
    }
  }
}

}  // namespace

std::vector<std::uint8_t> rotateJpeg(std::span<const std::uint8_t> file, int degrees,
                                     const DecodeLimits& limits) {
  const Turn turn = turnBy(degrees);
  checkFileSize(file.size(), limits);
  LibjpegReader reader(file);
  reader.keepAllSegments();
  reader.readHeader(limits.segments);
  checkLimits(reader, limits);
  jpeg_decompress_struct& source = reader.codec();
  jvirt_barray_ptr* before = nullptr;
  reader.run([&] { before = jpeg_read_coefficients(&source); });
  reader.checkEveryChannelCame();
  if (turn == Turn{}) return {file.begin(), file.end()};
  const Sampling sampling(source);
  if ((turn.reversesColumns() && source.image_width < sampling.unitWidth) ||
      (turn.reversesRows() && source.image_height < sampling.unitHeight))
    return turnPixels(file, turn);

  LibjpegWriter writer(file.size());
  jpeg_compress_struct& target = writer.codec();
  std::array<jvirt_barray_ptr, MAX_COMPONENTS> after;
  // One within the other, so that errors of either codec have where to land.
  reader.run([&] {
    writer.run([&] {
      jpeg_copy_critical_parameters(&source, &target);
      turnParameters(target, sampling, turn);
      for (int i = 0; i < target.num_components; ++i)
        after[i] = requestBlocks(target, target.comp_info[i], source.comp_info[i], turn);
      if (source.progressive_mode) jpeg_simple_progression(&target);
      target.write_JFIF_header = target.write_Adobe_marker = FALSE;
      jpeg_write_coefficients(&target, after.data());
      writer.copySegments(source);
      for (int i = 0; i < target.num_components; ++i)
        turnBlocks(source, before[i], target, after[i], target.comp_info[i], turn);
      jpeg_finish_compress(&target);
    });
  });
  return writer.takeFile();
}

}  // namespace pelorin::photo
