#include <algorithm>
#include <limits>

#include "bindings/c/pixels.h"
#include "image_processing/quality/block_features.h"
#include "image_processing/quality/niqe.h"

using namespace pelorin;
using namespace pelorin::c_api;

static_assert(QUENBY_NIQE_BLOCK == image_processing::niqeBlockSize);

int32_t quenby_niqe(const quenby_pixels* pixels, quenby_niqe_result* result, float* block_distances,
                    size_t capacity, quenby_error* error) {
  return guarded(error, [&] {
    checkStructSize(required(result, "result"), "result");
    const auto picture = viewOf(pixels);
    const size_t blocks =
        size_t{picture->width / QUENBY_NIQE_BLOCK} * size_t{picture->height / QUENBY_NIQE_BLOCK};
    if (block_distances != nullptr && capacity < blocks) {
      refuse("capacity", "the picture has " + std::to_string(blocks) + " blocks");
    }
    const image_processing::NiqeAnalysis niqe = image_processing::analyzeNiqe(*picture);
    quenby_niqe_result given{};
    given.score = niqe.score;
    given.block_columns = niqe.blockColumns;
    given.block_rows = niqe.blockRows;
    std::fill(std::begin(given.features), std::end(given.features),
              std::numeric_limits<float>::quiet_NaN());
    std::copy_n(niqe.meanFeatures.begin(),
                std::min(niqe.meanFeatures.size(), std::size(given.features)), given.features);
    if (block_distances != nullptr) {
      std::copy(niqe.blockDistances.begin(), niqe.blockDistances.end(), block_distances);
    }
    give(result, given, "result");
  });
}
