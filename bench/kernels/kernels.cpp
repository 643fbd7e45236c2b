#include "bench/kernels/kernels.h"

#include <algorithm>
#include <cstdlib>
#include <memory>

#include "image_processing/autoenhance/auto_enhance_filter.h"
#include "image_processing/autoenhance/colour/companding_steps.h"
#include "image_processing/autoenhance/enhance_row.h"
#include "image_processing/autoenhance/lightness/build_tone_curve.h"
#include "image_processing/autoenhance/masks/flatness_mask.h"
#include "image_processing/autoenhance/masks/grid_blur.h"
#include "image_processing/autoenhance/masks/grid_slice.h"
#include "image_processing/autoenhance/masks/grid_splat.h"
#include "image_processing/dupe/green_cdf.h"
#include "image_processing/features/brief_bits.h"
#include "image_processing/features/fast.h"
#include "image_processing/features/fast_rows.h"
#include "image_processing/filters/looks/apply_look.h"
#include "image_processing/filters/looks/low_dim_rgb_curve_filter.h"
#include "image_processing/filters/looks/preset_looks.h"
#include "image_processing/quality/niqe_features.h"
#include "tests/support/looks.h"

namespace pelorin::bench {
namespace {

using namespace image_processing;
using Photo = Image<RGBA8Pixel>;
using Bytes = QuantizedFloat<unsigned char>;

constexpr float sigmaRange = 0.7f;
constexpr int flatnessRadius = 8;
constexpr int cornerThreshold = 20, cornerArc = 9;

float cellSizeOf(const Photo& photo) {
  return static_cast<float>(std::min(photo.width, photo.height) / 40);
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
  for (std::size_t i = 0; i < steps.size(); ++i) {
    lightness.data.get()[i] = unitLightnessOfSteps()[steps[i]];
  }
  return lightness;
}

template <typename Mask>
void addPass(std::vector<Kernel>& kernels, const std::string& name, const Photo& photo,
             const Image<Mask>* masks) {
  ImageStatistics statistics;
  analyzeImage(photo, {}, statistics);
  FilterConfig config = defaultFilterConfigValue;
  updateFilterConfigForSliderValue(0.4f, &config);
  const TonePass pass(buildToneCurve(statistics, config), 100.0f, config.vibrance, config.ltmBlend,
                      config.detailGain);
  const Photo output(photo.width, photo.height);
  const auto runs = [=, held = masks == nullptr ? Image<Mask>(0, 0) : *masks](auto row) {
    return [=] {
      const Mask* const mask = held.pixelCount() == 0 ? nullptr : held.data.get();
      row(pass, photo.data.get(), mask, mask, output.data.get(), photo.pixelCount());
    };
  };
  kernels.push_back({name, runs(enhanceRow<Mask>), runs(enhanceRowScalar<Mask>)});
}

template <typename Mask>
void addMasks(std::vector<Kernel>& kernels, const std::string& mask, const Photo& photo,
              const Image<float>& lightness) {
  const float cellSize = cellSizeOf(photo);
  const auto grid = std::make_shared<Grid>(emptyGrid(photo));
  splat(lightness, cellSize, *grid);
  blur(*grid, sigmaRange);
  Image<Mask> smoothed(photo.width, photo.height), flatness(photo.width, photo.height);
  slice(*grid, lightness, cellSize, smoothed);

  kernels.push_back({"slice/" + mask,
                     [=]() mutable { slice(*grid, lightness, cellSize, smoothed); },
                     [=]() mutable { sliceScalar(*grid, lightness, cellSize, smoothed); }});
  kernels.push_back(
      {"flatness/" + mask,
       [=]() mutable { computeFlatnessMask(lightness, smoothed, flatnessRadius, flatness); },
       [=]() mutable {
         computeFlatnessMaskScalar(lightness, smoothed, flatnessRadius, flatness);
       }});
  addPass(kernels, "pass/" + mask, photo, &smoothed);
}

template <typename Filter>
void addAutoEnhance(std::vector<Kernel>& kernels, const std::string& name, const Photo& photo) {
  const auto state = std::make_shared<FilteredImageState>(
      FilteredImageState{std::make_shared<Photo>(photo), {}, "", defaultFilterConfigValue});
  const auto prepared = std::make_shared<Filter>(state);
  prepared->init("");
  kernels.push_back({name + "/init", [=] { Filter(state).init(""); }, {}});
  const auto applyTo = [=](Photo output) {
    prepared->applyConfig("slider=0.4;", defaultFilterConfigValue, output);
  };
  const Photo output(photo.width, photo.height);
  kernels.push_back({name + "/apply", [=] { applyTo(output); }, {}});
}

template <typename Filter>
void addLook(std::vector<Kernel>& kernels, const std::string& name, const Photo& photo) {
  const auto vignette = std::make_shared<CubicRadialMask>(test_support::maskOf<Filter>());
  for (const bool withVignette : {true, false}) {
    const auto runs = [=,
                       look = test_support::lookOf<Filter>(withVignette ? vignette.get() : nullptr),
                       output = Photo(photo.width, photo.height)](auto apply) {
      return [=, kept = vignette]() mutable { apply(look, photo, output); };
    };
    kernels.push_back({"look/" + name + (withVignette ? "/vignette" : "/plain"), runs(applyLook),
                       runs(applyLookScalar)});
  }
}

void addDupesAndQuality(std::vector<Kernel>& kernels, const Photo& photo) {
  const auto cdf = std::make_shared<GreenCDF>();
  kernels.push_back({"green-cdf", [=] { computeGreenCDF(photo, *cdf); },
                     [=] { computeGreenCDFScalar(photo, *cdf); }});
  kernels.push_back({"quality", [=] { niqeFeatures(photo); }, [=] { niqeFeaturesScalar(photo); }});
}

void addFeatures(std::vector<Kernel>& kernels, const Photo& photo) {
  const Image<unsigned char> grey(photo.width, photo.height);
  for (std::size_t i = 0; i < photo.pixelCount(); ++i) grey.data.get()[i] = photo.data.get()[i].g;
  const auto scores = std::make_shared<std::vector<std::uint8_t>>(photo.width);
  const auto scoreRows = [=](auto scoreRow) {
    return [=] {
      for (std::uint32_t y = 3; y + 3 < grey.height; ++y) {
        scoreRow(grey.row(y), grey.width, 3, grey.width - 3, cornerArc, cornerThreshold,
                 scores->data());
      }
    };
  };
  kernels.push_back({"corners/score", scoreRows(fastScoreRow), scoreRows(fastScoreRowScalar)});
  kernels.push_back({"corners/detect",
                     [=] {
                       int count = 0;
                       std::free(fast9_detect_nonmax(grey.data.get(), static_cast<int>(grey.width),
                                                     static_cast<int>(grey.height),
                                                     static_cast<int>(grey.width), cornerThreshold,
                                                     &count));
                     },
                     {}});

  // Corners all over the picture, so that a pixel costs a 225th of a corner.
  const auto describe = [=](auto bits) {
    return [=] {
      for (std::uint32_t y = 16; y + 16 < grey.height; y += 15) {
        for (std::uint32_t x = 16; x + 16 < grey.width; x += 15) {
          (*scores)[x] = static_cast<std::uint8_t>(bits(grey.row(y) + x)[0]);
        }
      }
    };
  };
  const BriefOffsets offsets = briefOffsets(grey.width);
  kernels.push_back({"descriptors",
                     describe([=](const std::uint8_t* at) { return briefBits(at, offsets); }),
                     describe([width = grey.width](const std::uint8_t* at) {
                       return briefBitsScalar(at, width);
                     })});
}

}  // namespace

std::vector<Kernel> kernelsOn(const Photo& photo) {
  std::vector<Kernel> kernels;
  addAutoEnhance<AEFilter>(kernels, "AE0", photo);
  addAutoEnhance<AEFilter8bit>(kernels, "AE08bit", photo);

  kernels.push_back({"statistics",
                     [=] {
                       ImageStatistics statistics;
                       analyzeImage(photo, {}, statistics);
                     },
                     {}});
  const auto steps = std::make_shared<std::vector<std::uint16_t>>(photo.pixelCount());
  const auto stepsBy = [=](auto kernel) {
    return [=] { kernel(photo.data.get(), steps->data(), steps->size()); };
  };
  kernels.push_back({"lightness", stepsBy(compandingSteps), stepsBy(compandingStepsScalar)});

  const Image<float> lightness = lightnessOf(photo);
  const float cellSize = cellSizeOf(photo);
  const auto splatBy = [=](auto kernel) {
    return [=] {
      Grid grid = emptyGrid(photo);
      kernel(lightness, cellSize, grid);
    };
  };
  kernels.push_back({"splat", splatBy(splat), splatBy(splatScalar)});
  Grid filled = emptyGrid(photo);
  splat(lightness, cellSize, filled);
  const auto blurBy = [=](auto kernel) {
    return [=] {
      Grid grid = filled;
      kernel(grid, sigmaRange);
    };
  };
  kernels.push_back({"blur", blurBy(blur), blurBy(blurScalar)});
  addMasks<float>(kernels, "float", photo, lightness);
  addMasks<Bytes>(kernels, "8bit", photo, lightness);
  addPass<float>(kernels, "pass/no-masks", photo, nullptr);

  addLook<ZebraBWFilter>(kernels, "ZebraBW", photo);
  addLook<SummerRGBFilter>(kernels, "SummerRGB", photo);
  addLook<SpringRGBFilter>(kernels, "SpringRGB", photo);
  addLook<FallRGBFilter>(kernels, "FallRGB", photo);
  addLook<VintageRGBFilter>(kernels, "VintageRGB", photo);
  addLook<WinterRGBFilter>(kernels, "WinterRGB", photo);
  addLook<LowDimRGBCurveFilter>(kernels, "LowDimRGBCurve", photo);
  addDupesAndQuality(kernels, photo);
  addFeatures(kernels, photo);
  return kernels;
}

}  // namespace pelorin::bench
