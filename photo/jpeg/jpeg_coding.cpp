#include "photo/jpeg/jpeg_coding.h"

#include <algorithm>
#include <cstdlib>

#include "photo/jpeg/libjpeg_writer.h"

namespace pelorin::photo {
namespace {

long distance(const JpegCoding::QuantizationTable& a, const JQUANT_TBL& b) {
  long sum = 0;
  for (std::size_t i = 0; i < a.size(); ++i) sum += std::abs(long{a[i]} - long{b.quantval[i]});
  return sum;
}

}  // namespace

std::optional<int> estimatedQuality(const JpegCoding& coding) {
  if (coding.tables.empty()) return std::nullopt;
  LibjpegWriter writer(0);
  jpeg_compress_struct& codec = writer.codec();
  int nearest = 100;
  writer.run([&] {
    long least = -1;
    for (int quality = 100; quality >= 1; --quality) {
      jpeg_set_quality(&codec, quality, TRUE);
      long sum = 0;
      for (std::size_t i = 0; i < coding.tables.size(); ++i)
        sum += distance(coding.tables[i], *codec.quant_tbl_ptrs[i]);
      if (least >= 0 && sum >= least) continue;
      least = sum;
      nearest = quality;
    }
  });
  return nearest;
}

}  // namespace pelorin::photo
