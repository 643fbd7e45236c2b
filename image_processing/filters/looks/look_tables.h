#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "image_processing/core/pixel_types.h"
#include "image_processing/filters/looks/look.h"
#include "image_processing/filters/looks/vignette_rows.h"

namespace pelorin::image_processing {

/// The output bytes of a look without channel mix, for the 256 values of each channel.
using LookTable = std::array<std::array<std::uint8_t, 256>, 3>;

/// The table of a look without vignette, by the scalar functions. The look has the mix `none`.
LookTable lookTable(const Look& look);

/// The table at each sample of the mask of a look with a vignette and the mix `none`.
/// @throws std::bad_alloc when 768 bytes for each sample do not fit.
std::vector<LookTable> lookTables(const Look& look);

/// Looks up pixels of a look without vignette.
/// @param from  `count` pixels.
/// @param to    written; `from` itself or no part of it.
void applyLookTable(const LookTable& table, const RGBA8Pixel* from, RGBA8Pixel* to,
                    std::size_t count);

/// Looks up the first `count` pixels of a row, each in the table of its mask sample.
void applyLookTables(const LookTable* tables, const VignetteRow& row, const RGBA8Pixel* from,
                     RGBA8Pixel* to, std::size_t count);

}  // namespace pelorin::image_processing
