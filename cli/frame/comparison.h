#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "cli/frame/faces.h"
#include "photo/file_view.h"
#include "photo/photo.h"

namespace pelorin::cli {

/// How large the pictures of a comparison are: the most pixels on their longer sides.
struct ComparisonSize {
  std::uint32_t side;      ///< Of before and after.
  std::uint32_t step = 0;  ///< Of the steps; 0 for none.
};

/// More would make a page that no browser shows.
constexpr std::size_t mostCompared = 2000;

/// The sizes for a page of so many photos: the more there are, the smaller.
ComparisonSize comparisonSize(std::size_t photos);

/// What was made of a photo.
struct ComparedFiles {
  photo::FileView before;
  photo::FileView after;    ///< Empty where there is none.
  photo::OpenOptions open;  ///< How `before` was read.
  std::vector<Face> faces;  ///< That the user told.
  std::string filter, params;
};

/// A picture of a photo at one slider.
struct SliderStep {
  std::string slider;
  bool chosen;  ///< The one that the photo was filtered with.
  std::vector<std::uint8_t> jpeg;
};

/// A face in fractions of the picture.
struct ComparedFace {
  float left, top, right, bottom;
  std::string name;  ///< Of the person; mostly empty.
};

/// Before and after, small, and what is to be told of them.
struct Comparison {
  photo::PictureSize size;                     ///< Of the result.
  photo::PictureSize shown;                    ///< Of both pictures.
  std::vector<std::uint8_t> before, after;     ///< JPEG files.
  std::vector<float> lightBefore, lightAfter;  ///< Shares of pixels by lightness, dark to light.
  std::vector<float> curve;                    ///< Of lightness; empty where the filter has none.
  std::vector<SliderStep> steps;               ///< Weakest first; empty as `curve`.
  std::vector<ComparedFace> faces;
};

/// Decodes both files no larger than needed and compares them. The steps are made of the small picture.
/// Without an `after`, what would come of it stays empty.
/// @throws PhotoError; Interrupted; std::bad_alloc.
Comparison compareFiles(const ComparedFiles& files, const ComparisonSize& size);

}  // namespace pelorin::cli
