#include "tests/photo/collection/pair_samples.h"

#include <fmt/format.h>

#include <algorithm>
#include <functional>
#include <memory>
#include <utility>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "photo/area_average.h"
#include "photo/collection/photo_record.h"
#include "photo/jpeg/jpeg_codec.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using image_processing::RGBA8Pixel;
using photo::Shot;
using photo::ShotPair;

struct Place {
  std::uint32_t x, y;
};

Picture partOf(const Picture& picture, Place corner, photo::PictureSize size) {
  Picture part(size.width, size.height);
  for (std::uint32_t y = 0; y < size.height; ++y) {
    std::copy_n(picture.row(corner.y + y) + corner.x, size.width, part.row(y));
  }
  return part;
}

photo::PictureSize percentOf(const Picture& picture, std::uint32_t percent) {
  return {picture.width * percent / 100, picture.height * percent / 100};
}

Picture middleOf(const Picture& picture, std::uint32_t percent) {
  const photo::PictureSize size = percentOf(picture, percent);
  return partOf(picture, {(picture.width - size.width) / 2, (picture.height - size.height) / 2},
                size);
}

Picture turned(const Picture& picture) {
  Picture result(picture.height, picture.width);
  for (std::uint32_t y = 0; y < result.height; ++y) {
    for (std::uint32_t x = 0; x < result.width; ++x) {
      result.row(y)[x] = picture.row(picture.height - 1 - x)[y];
    }
  }
  return result;
}

Picture enhanced(const Picture& picture) {
  using namespace image_processing;
  auto photo = std::make_shared<Picture>(picture);
  FilteredImage session(photo, {}, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
  Picture result(picture.width, picture.height);
  session.applyFilterWithParams("AE0", "slider=0.4;", defaultFilterConfigValue, result);
  return result;
}

std::uint8_t light(int value) {
  return static_cast<std::uint8_t>(std::clamp(value, 0, 255));
}

/// How a shot of a burst differs from the first.
struct Shake {
  std::uint32_t movedPercent, exposurePercent, passerbyPercent;
};

// What the camera sees a moment later: a view moved within the scene, in another exposure, with noise
// and with part of another scene in front.
Picture laterShot(const Picture& scene, const Picture& passerby, const Shake& shake,
                  std::uint64_t seed) {
  const std::uint32_t left = scene.width * shake.movedPercent / 100;
  const std::uint32_t top = scene.height * shake.movedPercent / 200;
  Picture shot = partOf(scene, {left, top}, percentOf(scene, 90));
  const photo::PictureSize front = percentOf(shot, shake.passerbyPercent);
  for (std::uint32_t y = 0; y < std::min(front.height, passerby.height); ++y) {
    std::copy_n(passerby.row(y), std::min(front.width, passerby.width),
                shot.row(shot.height / 3 + y) + shot.width / 3);
  }
  Random random(seed);
  for (std::uint32_t y = 0; y < shot.height; ++y) {
    for (std::uint32_t x = 0; x < shot.width; ++x) {
      RGBA8Pixel& p = shot.row(y)[x];
      const int noise = static_cast<int>(random.below(9)) - 4;
      const auto exposed = [&](int value) {
        return light(value * static_cast<int>(shake.exposurePercent) / 100 + noise);
      };
      p = {exposed(p.r), exposed(p.g), exposed(p.b), 255};
    }
  }
  return shot;
}

Shot shotOf(const Picture& picture, int orientation = 1, int quality = 90) {
  const std::vector<std::uint8_t> file =
      photo::encodeJpeg(&picture.data.get()->r, picture.width, picture.height, quality);
  return {photo::readPhotoRecord(file).cdf, orientation, {}};
}

ShotPair pairOf(Shot a, Shot b, double seconds) {
  a.time = photo::ShotTime{0, {}};
  b.time = photo::ShotTime{seconds, {}};
  return compareShots(a, b);
}

PairSamples copiesOf(const std::vector<Picture>& scenes, const std::vector<Shot>& shots,
                     std::string name, const std::function<Shot(const Picture&)>& copyOf) {
  PairSamples samples = {std::move(name), true, true, {}};
  for (std::size_t i = 0; i < scenes.size(); ++i) {
    samples.pairs.push_back(pairOf(shots[i], copyOf(scenes[i]), 0));
  }
  return samples;
}

PairSamples burstOf(const std::vector<Picture>& scenes, std::string name, const Shake& shake,
                    double seconds) {
  PairSamples samples = {std::move(name), true, false, {}};
  for (std::size_t i = 0; i < scenes.size(); ++i) {
    const Picture& passerby = scenes[(i + 1) % scenes.size()];
    const Picture first = laterShot(scenes[i], passerby, {0, 100, 0}, 2 * i);
    const Picture later = laterShot(scenes[i], passerby, shake, 2 * i + 1);
    samples.pairs.push_back(pairOf(shotOf(first), shotOf(later), seconds));
  }
  return samples;
}

PairSamples besideEachOther(const std::vector<Picture>& scenes, double seconds) {
  PairSamples samples = {
      fmt::format("the left and the right of one place, {} s", seconds), false, false, {}};
  for (const Picture& scene : scenes) {
    const photo::PictureSize half = {scene.width / 2, scene.height};
    samples.pairs.push_back(pairOf(shotOf(partOf(scene, {0, 0}, half)),
                                   shotOf(partOf(scene, {scene.width - half.width, 0}, half)),
                                   seconds));
  }
  return samples;
}

PairSamples unrelated(const std::vector<Shot>& shots, double seconds) {
  PairSamples samples = {fmt::format("unrelated, {} s", seconds), false, false, {}};
  for (std::size_t i = 0; i < shots.size(); ++i) {
    for (std::size_t j = i + 1; j < shots.size(); ++j) {
      samples.pairs.push_back(pairOf(shots[i], shots[j], seconds));
    }
  }
  return samples;
}

}  // namespace

std::vector<PairSamples> pairSamples(const std::vector<Picture>& scenes) {
  std::vector<Shot> shots;
  for (const Picture& scene : scenes) shots.push_back(shotOf(scene));
  const auto copies = [&](std::string name, const std::function<Shot(const Picture&)>& copyOf) {
    return copiesOf(scenes, shots, std::move(name), copyOf);
  };
  const auto burst = [&](std::string name, const Shake& shake, double seconds) {
    return burstOf(scenes, std::move(name), shake, seconds);
  };
  return {
      copies("saved again at quality 60", [](const Picture& p) { return shotOf(p, 1, 60); }),
      copies("half as wide",
             [](const Picture& p) {
               return shotOf(photo::areaAverage(p, {(p.width + 1) / 2, (p.height + 1) / 2}));
             }),
      copies("crop, 90 % of each side", [](const Picture& p) { return shotOf(middleOf(p, 90)); }),
      copies("crop, 70 % of each side", [](const Picture& p) { return shotOf(middleOf(p, 70)); }),
      copies("turned, orientation 1 and 6", [](const Picture& p) { return shotOf(turned(p), 6); }),
      copies("enhanced", [](const Picture& p) { return shotOf(enhanced(p)); }),
      burst("burst, 0.3 s", {1, 100, 0}, 0.3),
      burst("burst, 1 s", {3, 90, 15}, 1),
      burst("burst, 3 s", {6, 80, 25}, 3),
      burst("burst, 10 s", {10, 125, 30}, 10),
      besideEachOther(scenes, 3),
      unrelated(shots, 1),
      unrelated(shots, 3),
      unrelated(shots, 10),
      unrelated(shots, 30),
  };
}

}  // namespace pelorin::test_support
