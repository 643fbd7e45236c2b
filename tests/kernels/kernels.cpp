#include "tests/kernels/kernels.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstdlib>
#include <memory>
#include <utility>

#include "image_processing/autoenhance/auto_enhance_filter.h"
#include "image_processing/autoenhance/colour/companding_steps.h"
#include "image_processing/autoenhance/enhance_row.h"
#include "image_processing/autoenhance/lightness/build_tone_curve.h"
#include "image_processing/autoenhance/lightness/cdf.h"
#include "image_processing/autoenhance/lightness/lightness_histogram.h"
#include "image_processing/autoenhance/masks/face_blend_row.h"
#include "image_processing/autoenhance/masks/flatness_mask.h"
#include "image_processing/autoenhance/masks/flatness_rows.h"
#include "image_processing/autoenhance/masks/grid_blur.h"
#include "image_processing/autoenhance/masks/grid_slice.h"
#include "image_processing/autoenhance/masks/grid_splat.h"
#include "image_processing/autoenhance/masks/skin.h"
#include "image_processing/autoenhance/masks/summed_area_rows.h"
#include "image_processing/dupe/green_cdf.h"
#include "image_processing/features/brief_bits.h"
#include "image_processing/features/fast.h"
#include "image_processing/features/fast_rows.h"
#include "image_processing/filters/looks/apply_look.h"
#include "image_processing/filters/looks/low_dim_rgb_curve_filter.h"
#include "image_processing/filters/looks/preset_looks.h"
#include "image_processing/quality/im_halve.h"
#include "image_processing/quality/image_structure.h"
#include "image_processing/quality/niqe_features.h"
#include "image_processing/quality/niqe_grey.h"
#include "tests/support/filter_state.h"
#include "tests/support/grey_pictures.h"
#include "tests/support/looks.h"

namespace pelorin::test_support {
namespace {

using namespace image_processing;
using Photo = Image<RGBA8Pixel>;
using Quantized = QuantizedFloat<unsigned char>;

constexpr float sigmaRange = 0.7f;
constexpr int flatnessRadius = 8;
constexpr int cornerThreshold = 20, cornerArc = 9;

// What kernels write into.

template <typename T>
std::span<std::byte> bytesOf(T* first, std::size_t count) {
  return std::as_writable_bytes(std::span(first, count));
}

/// An image to be written, and room behind it that is not.
template <typename T>
struct Output {
  static constexpr std::size_t behind = 64;

  Output(std::uint32_t width, std::uint32_t height)
      : count(std::size_t{width} * height + behind),
        image(width, height, std::shared_ptr<T>(new T[count], std::default_delete<T[]>())) {
    preferHugePages(image.data.get(), count * sizeof(T));
  }
  std::span<std::byte> operator()() const { return bytesOf(image.data.get(), count); }

  std::size_t count;
  Image<T> image;
};

/// A kernel of two functions that take the same: `call` is given either.
template <typename Vectors, typename Definition, typename Call>
Kernel kernelOf(Vectors vectors, Definition definition, Call call,
                std::function<std::span<std::byte>()> written) {
  return {[=]() mutable { call(vectors); }, [=]() mutable { call(definition); }, written};
}

/// Of functions that make a value of each pixel.
template <typename Value>
Kernel overPixels(const Photo& photo, void (*vectors)(const RGBA8Pixel*, Value*, std::size_t),
                  void (*definition)(const RGBA8Pixel*, Value*, std::size_t)) {
  const Output<Value> out(photo.width, photo.height);
  return kernelOf(
      vectors, definition,
      [=](auto* kernel) { kernel(photo.data.get(), out.image.data.get(), photo.pixelCount()); },
      out);
}

// Auto-enhance.

template <typename Filter>
Kernel init(const Photo& photo) {
  return {[state = stateOf(photo)] { Filter(state).init(""); }, {}, {}};
}

template <typename Filter>
Kernel apply(const Photo& photo) {
  const auto filter = std::make_shared<Filter>(stateOf(photo));
  filter->init("");
  return {[=, output = Photo(photo.width, photo.height)]() mutable {
            filter->applyConfig("slider=0.4;", defaultFilterConfigValue, output);
          },
          {},
          {}};
}

void countByDefinition(const Photo& photo, const ImageMetadata&, ImageStatistics& statistics) {
  std::vector<std::uint16_t> steps(photo.pixelCount());
  compandingStepsScalar(photo.data.get(), steps.data(), steps.size());
  LightnessHistogram histogram(lightnessBins, lightnessScale);
  histogram.add(steps.data(), steps.size());
  computeCDF(histogram.normalised(), statistics.cdf);
}

Kernel statistics(const Photo& photo) {
  const auto made = std::make_shared<ImageStatistics>();
  made->cdf.resize(lightnessBins + 1);
  const auto analyse = [](const Photo& photo, const ImageMetadata& metadata,
                          ImageStatistics& statistics) {
    analyzeImage(photo, metadata, statistics);
  };
  return kernelOf(
      analyse, countByDefinition, [=](auto kernel) { kernel(photo, {}, *made); },
      [=] { return bytesOf(made->cdf.data(), made->cdf.size()); });
}

Kernel lightness(const Photo& photo) {
  return overPixels<std::uint16_t>(photo, compandingSteps, compandingStepsScalar);
}

float cellSizeOf(const Photo& photo) {
  return static_cast<float>(std::max(std::min(photo.width, photo.height) / 40, 1u));
}

Grid emptyGrid(const Photo& photo) {
  const float cellSize = cellSizeOf(photo);
  return Grid(static_cast<std::int64_t>(photo.width / cellSize),
              static_cast<std::int64_t>(photo.height / cellSize));
}

Image<float> lightnessOf(const Photo& photo) {
  Image<float> lightness(photo.width, photo.height);
  std::vector<std::uint16_t> steps(photo.pixelCount());
  compandingSteps(photo.data.get(), steps.data(), steps.size());
  unitLightness(steps.data(), lightness.data.get(), steps.size());
  return lightness;
}

Grid splatted(const Photo& photo) {
  Grid grid = emptyGrid(photo);
  splat(lightnessOf(photo), cellSizeOf(photo), grid);
  return grid;
}

Kernel gridSplat(const Photo& photo) {
  const auto grid = std::make_shared<Grid>(0, 0);
  return kernelOf(
      splat, splatScalar,
      [=, lightness = lightnessOf(photo)](auto* kernel) {
        *grid = emptyGrid(photo);
        kernel(lightness, cellSizeOf(photo), *grid);
      },
      [=] { return bytesOf(grid->cells.data(), grid->cells.size()); });
}

Kernel gridBlur(const Photo& photo) {
  const auto grid = std::make_shared<Grid>(0, 0);
  return kernelOf(
      +[](Grid& grid, float range) { blur(grid, range); }, blurScalar,
      [=, before = splatted(photo)](auto* kernel) {
        Grid blurred = before;
        kernel(blurred, sigmaRange);
        *grid = std::move(blurred);
      },
      [=] { return bytesOf(grid->cells.data(), grid->cells.size()); });
}

template <typename Mask>
Kernel gridSlice(const Photo& photo) {
  const auto grid = std::make_shared<Grid>(splatted(photo));
  blur(*grid, sigmaRange);
  const Output<Mask> out(photo.width, photo.height);
  return kernelOf(
      slice<Mask>, sliceScalar<Mask>,
      [=, smoothed = out.image, lightness = lightnessOf(photo)](auto* kernel) mutable {
        kernel(*grid, lightness, cellSizeOf(photo), smoothed);
      },
      out);
}

template <typename Mask>
Image<Mask> smoothed(const Photo& photo) {
  Grid grid = splatted(photo);
  blur(grid, sigmaRange);
  Image<Mask> made(photo.width, photo.height);
  slice(grid, lightnessOf(photo), cellSizeOf(photo), made);
  return made;
}

template <typename Mask>
Kernel flatness(const Photo& photo) {
  using Function = void (*)(const Image<float>&, const Image<Mask>&, int, Image<Mask>&);
  const Output<Mask> out(photo.width, photo.height);
  return kernelOf(
      Function(computeFlatnessMask), Function(computeFlatnessMaskScalar),
      [=, mask = out.image, lightness = lightnessOf(photo), base = smoothed<Mask>(photo)](
          auto* kernel) mutable { kernel(lightness, base, flatnessRadius, mask); },
      out);
}

// The loops of the flatness mask.

template <typename Mask>
Kernel flatnessWeights(const Photo& photo) {
  const Output<float> out(photo.width, photo.height);
  return kernelOf(
      weighRow<Mask>, weighRowScalar<Mask>,
      [=, lightness = lightnessOf(photo), base = smoothed<Mask>(photo)](auto* kernel) {
        kernel(flatnessWeight(2 * flatnessRadius + 1), lightness.data.get(), base.data.get(),
               out.image.data.get(), photo.pixelCount());
      },
      out);
}

/// Weights of about the size that the mask's have, for a table that is larger by a window; behind
/// each row, the padding.
Image<float> tableWeights(const Photo& photo) {
  const std::uint32_t n = 2 * flatnessRadius + 1, band = sumRowsAtOnce;
  const Image<float> lightness = lightnessOf(photo);
  Image<float> weights(photo.width + n + sumRowsPadding,
                       (photo.height + n + band - 1) / band * band);
  weights.set(0.0f);
  for (std::uint32_t y = 0; y < weights.height; ++y) {
    for (std::uint32_t x = 0; x < photo.width + n; ++x) {
      const float one = lightness.row(y % photo.height)[x % photo.width];
      weights.row(y)[x] = one / static_cast<float>(n * n);
    }
  }
  return weights;
}

/// Turns weights into sums, and clears what the kernel left behind the rows.
void sumTable(decltype(sumRows)* kernel, Image<float>& table) {
  const std::uint32_t width = table.width - sumRowsPadding;
  const std::vector<float> zeros(table.width);
  const float* above = zeros.data();
  for (std::uint32_t y = 0; y < table.height; y += sumRowsAtOnce) {
    kernel(above, table.row(y), table.width, width);
    above = table.row(y + sumRowsAtOnce - 1);
  }
  for (std::uint32_t y = 0; y < table.height; ++y)
    std::fill_n(table.row(y) + width, sumRowsPadding, 0.0f);
}

Kernel flatnessSums(const Photo& photo) {
  const Image<float> weights = tableWeights(photo);
  const Output<float> out(weights.width, weights.height);
  return kernelOf(
      sumRows, sumRowsScalar,
      [=, table = out.image](auto* kernel) mutable {
        std::copy_n(weights.data.get(), weights.pixelCount(), table.data.get());
        sumTable(kernel, table);
      },
      out);
}

template <typename Mask>
Kernel flatnessShape(const Photo& photo) {
  constexpr std::ptrdiff_t n = 2 * flatnessRadius + 1;
  Image<float> table = tableWeights(photo);
  sumTable(sumRowsScalar, table);
  const Output<Mask> out(photo.width, photo.height);
  return kernelOf(
      shapeRow<Mask>, shapeRowScalar<Mask>,
      [=, shape = std::make_shared<FlatnessShape>()](auto* kernel) {
        for (std::uint32_t y = 0; y < photo.height; ++y) {
          kernel(table.row(y), table.row(y + n), n, *shape, out.image.row(y), photo.width);
        }
      },
      out);
}

Kernel skin(const Photo& photo) {
  return overPixels<float>(photo, findSkin, findSkinScalar);
}

/// Eight faces in one place; the weights of columns are any.
template <typename Mask>
Kernel faceBlend(const Photo& photo) {
  Image<float> skin(photo.width, photo.height);
  findSkin(photo.data.get(), skin.data.get(), photo.pixelCount());
  const Output<Mask> out(photo.width, photo.height);
  return kernelOf(
      blendFaceRow<Mask>, blendFaceRowScalar<Mask>,
      [=, columns = lightnessOf(photo), before = smoothed<Mask>(photo)](auto* kernel) {
        std::copy_n(before.data.get(), before.pixelCount(), out.image.data.get());
        kernel(columns.data.get(), 0.7f, skin.data.get(), 8, out.image.data.get(),
               photo.pixelCount());
      },
      out);
}

/// The pass over the pixels as one slider position asks for it; both masks are the smoothing.
template <typename Mask, bool withMasks>
Kernel pass(const Photo& photo) {
  ImageStatistics statistics;
  analyzeImage(photo, {}, statistics);
  FilterConfig config = defaultFilterConfigValue;
  updateFilterConfigForSliderValue(0.4f, &config);
  const TonePass pass(buildToneCurve(statistics, config), 100.0f, config.vibrance, config.ltmBlend,
                      config.detailGain);
  const Image<Mask> masks = withMasks ? smoothed<Mask>(photo) : Image<Mask>(0, 0);
  const Output<RGBA8Pixel> out(photo.width, photo.height);
  return kernelOf(
      enhanceRow<Mask>, enhanceRowScalar<Mask>,
      [=](auto* kernel) {
        const Mask* const mask = withMasks ? masks.data.get() : nullptr;
        kernel(pass, photo.data.get(), mask, mask, out.image.data.get(), photo.pixelCount());
      },
      out);
}

// Looks.

template <typename Filter, bool withVignette>
Kernel look(const Photo& photo) {
  const auto vignette = std::make_shared<CubicRadialMask>(maskOf<Filter>());
  const Output<RGBA8Pixel> out(photo.width, photo.height);
  return kernelOf(
      +[](const Look& look, const Photo& photo, Image<RGBA8Pixel>& output) {
        applyLook(look, photo, output);
      },
      applyLookScalar,
      [=, kept = vignette, output = out.image,
       look = lookOf<Filter>(withVignette ? vignette.get() : nullptr)](auto* kernel) mutable {
        kernel(look, photo, output);
      },
      out);
}

// Duplicates and quality.

Kernel greenCdf(const Photo& photo) {
  const auto cdf = std::make_shared<GreenCDF>();
  return kernelOf(
      computeGreenCDF, computeGreenCDFScalar, [=](auto* kernel) { kernel(photo, *cdf); },
      [=] { return bytesOf(cdf->data(), cdf->size()); });
}

Kernel quality(const Photo& photo) {
  const auto features = std::make_shared<Image<float>>(0, 0);
  return kernelOf(
      niqeFeatures, niqeFeaturesScalar,
      [=](auto* kernel) {
        if (isScorable(photo)) *features = kernel(photo);
      },
      [=] { return bytesOf(features->data.get(), features->pixelCount()); });
}

Kernel qualityGrey(const Photo& photo) {
  return overPixels<float>(photo, niqeGrey, niqeGreyScalar);
}

Image<float> greyFloats(const Photo& photo) {
  Image<float> grey(photo.width, photo.height);
  niqeGrey(photo.data.get(), grey.data.get(), photo.pixelCount());
  return grey;
}

Kernel qualityStructure(const Photo& photo) {
  const Output<float> out(photo.width, photo.height);
  return kernelOf(
      computeImageStructure_fast, computeImageStructure,
      [=, grey = greyFloats(photo), structure = out.image](auto* kernel) mutable {
        kernel(grey, grey.width, grey.height, structure);
      },
      out);
}

Kernel qualityHalve(const Photo& photo) {
  const Output<float> out(photo.width, photo.height);
  return kernelOf(
      imHalve, imHalveScalar,
      [=, grey = greyFloats(photo), halved = out.image](auto* kernel) mutable {
        std::copy_n(grey.data.get(), grey.pixelCount(), halved.data.get());
        std::uint32_t width = halved.width, height = halved.height;
        kernel(halved, width, height);
        // What is outside the half is nobody's business.
        for (std::uint32_t y = 0; y < halved.height; ++y) {
          std::fill(halved.row(y) + (y < height ? width : 0), halved.row(y) + halved.width, 0.0f);
        }
      },
      out);
}

Kernel qualityBlocks(const Photo& photo) {
  const Image<float> grey = greyFloats(photo);
  const Image<float> structure(photo.width, photo.height);
  Image<float> written = structure;
  computeImageStructure_fast(grey, grey.width, grey.height, written);
  const std::uint32_t columns = photo.width / niqeBlockSize, rows = photo.height / niqeBlockSize;
  const Output<float> out(columns * rows, niqeFeaturesPerScale);
  return kernelOf(
      computeBlockFeatures, computeBlockFeaturesScalar,
      [=, features = out.image](auto* kernel) mutable {
        kernel(structure, niqeFeaturesPerScale, niqeBlockSize, columns, rows, /*scale=*/0,
               features);
      },
      out);
}

// Corners and descriptors.

Kernel cornerScores(const Photo& photo) {
  const Output<std::uint8_t> out(photo.width, photo.height);
  return kernelOf(
      fastScoreRow, fastScoreRowScalar,
      [=, grey = greenOf(photo)](auto* kernel) {
        if (grey.width < 7) return;
        for (std::uint32_t y = 3; y + 3 < grey.height; ++y) {
          kernel(grey.row(y), grey.width, 3, grey.width - 3, cornerArc, cornerThreshold,
                 out.image.row(y));
        }
      },
      out);
}

template <auto detect>
Kernel corners(const Photo& photo) {
  return {[grey = greenOf(photo)] {
            const int width = static_cast<int>(grey.width), height = static_cast<int>(grey.height);
            int count = 0;
            std::free(detect(grey.data.get(), width, height, width, cornerThreshold, &count));
          },
          {},
          {}};
}

/// Corners all over the picture, so that a pixel costs a 225th of a corner.
Kernel descriptors(const Photo& photo) {
  const std::uint32_t columns = photo.width / 15 + 1, rows = photo.height / 15 + 1;
  const Output<std::array<std::uint32_t, 8>> out(columns, rows);
  const BriefOffsets offsets = briefOffsets(photo.width);
  return kernelOf(
      [=](const std::uint8_t* at) { return briefBits(at, offsets); },
      [width = photo.width](const std::uint8_t* at) { return briefBitsScalar(at, width); },
      [=, grey = greenOf(photo)](const auto& kernel) {
        for (std::uint32_t y = 16; y + 16 < grey.height; y += 15) {
          for (std::uint32_t x = 16; x + 16 < grey.width; x += 15) {
            out.image.row(y / 15)[x / 15] = kernel(grey.row(y) + x);
          }
        }
      },
      out);
}

}  // namespace

const std::vector<KernelRow>& kernelRows() {
  using enum Shape;
  using enum PictureKind;
  static const std::vector<KernelRow> rows = {
      {"AE0/init", step, init<AEFilter>},
      {"AE0/apply", step, apply<AEFilter>},
      {"AE08bit/init", step, init<AEFilter8bit>},
      {"AE08bit/apply", step, apply<AEFilter8bit>},
      {"statistics", row, statistics},
      {"lightness", row, lightness},
      {"splat", picture, gridSplat},
      {"blur", picture, gridBlur},
      {"slice/float", picture, gridSlice<float>},
      {"flatness/float", picture, flatness<float>},
      {"flatness/weights/float", row, flatnessWeights<float>},
      {"flatness/sums", picture, flatnessSums},
      {"flatness/shape/float", picture, flatnessShape<float>},
      {"skin", row, skin},
      {"face-blend/float", row, faceBlend<float>},
      {"pass/float", row, pass<float, true>},
      {"slice/8bit", picture, gridSlice<Quantized>},
      {"flatness/8bit", picture, flatness<Quantized>},
      {"flatness/weights/8bit", row, flatnessWeights<Quantized>},
      {"flatness/shape/8bit", picture, flatnessShape<Quantized>},
      {"face-blend/8bit", row, faceBlend<Quantized>},
      {"pass/8bit", row, pass<Quantized, true>},
      {"pass/no-masks", row, pass<float, false>},
      {"look/ZebraBW/vignette", picture, look<ZebraBWFilter, true>},
      {"look/ZebraBW/plain", picture, look<ZebraBWFilter, false>},
      {"look/SummerRGB/vignette", picture, look<SummerRGBFilter, true>},
      {"look/SummerRGB/plain", picture, look<SummerRGBFilter, false>},
      {"look/SpringRGB/vignette", picture, look<SpringRGBFilter, true>},
      {"look/SpringRGB/plain", picture, look<SpringRGBFilter, false>},
      {"look/FallRGB/vignette", picture, look<FallRGBFilter, true>},
      {"look/FallRGB/plain", picture, look<FallRGBFilter, false>},
      {"look/VintageRGB/vignette", picture, look<VintageRGBFilter, true>},
      {"look/VintageRGB/plain", picture, look<VintageRGBFilter, false>},
      {"look/WinterRGB/vignette", picture, look<WinterRGBFilter, true>},
      {"look/WinterRGB/plain", picture, look<WinterRGBFilter, false>},
      {"look/LowDimRGBCurve/vignette", picture, look<LowDimRGBCurveFilter, true>},
      {"look/LowDimRGBCurve/plain", picture, look<LowDimRGBCurveFilter, false>},
      {"green-cdf", row, greenCdf, {oneColour, noise}},
      {"quality", picture, quality},
      {"quality/grey", row, qualityGrey},
      {"quality/structure", picture, qualityStructure},
      {"quality/halve", picture, qualityHalve},
      {"quality/blocks", picture, qualityBlocks},
      {"corners/score", picture, cornerScores, {detail, leaves, smooth}},
      {"corners/detect", step, corners<fast9_detect_nonmax>, {detail, leaves, smooth}},
      {"descriptors", picture, descriptors},
  };
  return rows;
}

}  // namespace pelorin::test_support
