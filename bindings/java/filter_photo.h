#pragma once

#include <cstdint>
#include <span>
#include <stop_token>
#include <string>
#include <vector>

#include "image_processing/core/face_fractions.h"

namespace pelorin::quenby {

/// What to make of a photo, in the terms of `quenby enhance`.
struct FilterRequest {
  std::string filter;  ///< A name in the registry.
  std::string params;
  int quality = 90;
  int rotation = 0;  ///< Degrees clockwise beyond upright.
  int scale = 1;
  std::vector<image_processing::FaceFractions> faces = {};  ///< Beside those the file knows of.
  std::stop_token stop = {};
};

/// The bytes of the file that the command writes for the same options: upright, filtered, with the
/// metadata kept.
/// @throws std::invalid_argument that names what is wrong with the request: the filter, the key of
///         its parameters and what it wants, quality, rotation, scale or faces; PhotoError, with
///         Stopped when `stop` says so; std::bad_alloc.
std::vector<std::uint8_t> filterPhoto(std::span<const std::uint8_t> file,
                                      const FilterRequest& request);

}  // namespace pelorin::quenby
