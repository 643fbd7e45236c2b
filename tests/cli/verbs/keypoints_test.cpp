#include <gmock/gmock.h>

#include <cstdio>
#include <cstdlib>
#include <functional>
#include <memory>

#include "image_processing/features/brief.h"
#include "image_processing/features/fast.h"
#include "photo/photo.h"
#include "photo/turned_image.h"
#include "tests/cli/parsed_json.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/bytes.h"
#include "tests/support/exif_payload.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using image_processing::BriefDescriptor;
using testing::HasSubstr;
using testing::IsEmpty;

Image<unsigned char> greenOf(const Image<RGBA8Pixel>& image) {
  Image<unsigned char> green(image.width, image.height);
  for (std::size_t i = 0; i < image.pixelCount(); ++i) green.data.get()[i] = image.data.get()[i].g;
  return green;
}

struct Engine {
  decltype(&fast9_detect) detect, detectNonmax;
  decltype(&fast9_score) score;
};

Engine engineOf(int n) {
  switch (n) {
    case 9:
      return {fast9_detect, fast9_detect_nonmax, fast9_score};
    case 10:
      return {fast10_detect, fast10_detect_nonmax, fast10_score};
    case 11:
      return {fast11_detect, fast11_detect_nonmax, fast11_score};
    default:
      return {fast12_detect, fast12_detect_nonmax, fast12_score};
  }
}

/// The engine's own corners as the command prints them.
std::string engineText(const Image<RGBA8Pixel>& picture, int n, int threshold, bool suppressed,
                       const std::function<std::string(const xy&)>& behind = nullptr) {
  const Image<unsigned char> grey = greenOf(picture);
  const Engine engine = engineOf(n);
  const int width = static_cast<int>(grey.width), height = static_cast<int>(grey.height);
  int count = 0;
  const std::unique_ptr<xy[], decltype(&std::free)> corners(
      (suppressed ? engine.detectNonmax : engine.detect)(grey.data.get(), width, height, width,
                                                         threshold, &count),
      std::free);
  const std::unique_ptr<int[], decltype(&std::free)> scores(
      engine.score(grey.data.get(), width, corners.get(), count, threshold), std::free);
  std::string text;
  for (int i = 0; i < count; ++i) {
    text += std::to_string(corners[i].x) + " " + std::to_string(corners[i].y) + " " +
            std::to_string(scores[i]) + (behind ? behind(corners[i]) : "") + "\n";
  }
  return text;
}

/// " " and the bits as digits, the highest first; nothing without a descriptor.
std::string hexBehind(const std::vector<BriefDescriptor>& descriptors, const xy& corner) {
  for (const BriefDescriptor& described : descriptors) {
    if (described.center != corner) continue;
    std::string digits = " ";
    for (int digit = 63; digit >= 0; --digit) {
      int value = 0;
      for (int bit = digit * 4 + 3; bit >= digit * 4; --bit) {
        value =
            2 * value + (described.descriptor[static_cast<std::size_t>(bit / 32)] >> bit % 32 & 1);
      }
      digits += "0123456789abcdef"[value];
    }
    return digits;
  }
  return "";
}

class Keypoints : public testing::Test {
 protected:
  /// Runs `quenby keypoints` on raw pixels.
  Finished onRaw(const Image<RGBA8Pixel>& pixels, std::vector<std::string> options) {
    options.insert(options.begin(),
                   {"keypoints", folder.write("in.rgba", rawBytes(pixels)), "--raw",
                    std::to_string(pixels.width) + "x" + std::to_string(pixels.height)});
    return quenby(options);
  }

  const TemporaryFolder folder;
  const Image<RGBA8Pixel> picture = photoLikePicture(173, 91, 3);
  const Image<RGBA8Pixel> noise = noisePicture(64, 48, 7);
};

// Found some hundred rows at a time: none is missed or told twice where two pieces meet.
TEST_F(Keypoints, OfAHighPictureAreTheEnginesOwn) {
  const Image<RGBA8Pixel> high = photoLikePicture(75, 1100, 5);
  std::vector<BriefDescriptor> descriptors;
  const Image<unsigned char> grey = greenOf(high);
  for (const bool suppressed : {true, false}) {
    descriptors.clear();
    const std::string bare = engineText(high, 9, 9, suppressed, [&](const xy& corner) {
      image_processing::brief(&corner, 1, grey, descriptors);
      return "";
    });
    ASSERT_GT(descriptors.size(), 300u);
    std::vector<std::string> options = {"--text", "--threshold", "9"};
    if (!suppressed) options.push_back("--no-suppression");
    EXPECT_EQ(onRaw(high, options).output, bare);
    options.push_back("--brief");
    EXPECT_EQ(onRaw(high, options).output,
              engineText(high, 9, 9, suppressed,
                         [&](const xy& corner) { return hexBehind(descriptors, corner); }));
  }
}

TEST_F(Keypoints, AreTheEnginesOwnForEveryN) {
  for (const auto& pixels : {picture, noise}) {
    for (const int n : {9, 10, 11, 12}) {
      const std::string number = std::to_string(n);
      const std::string kept = engineText(pixels, n, 20, true);
      EXPECT_EQ(onRaw(pixels, {"--text", "--n", number}).output, kept);
      const std::string all = engineText(pixels, n, 20, false);
      EXPECT_EQ(onRaw(pixels, {"--text", "--n", number, "--no-suppression"}).output, all);
      if (n == 9) {
        EXPECT_THAT(kept, Not(IsEmpty()));
        EXPECT_LT(kept.size(), all.size());
        EXPECT_EQ(onRaw(pixels, {"--text"}).output, kept);
      }
    }
  }
}

TEST_F(Keypoints, FollowTheThreshold) {
  for (const int threshold : {0, 1, 60, 254, 255}) {
    const Finished run = onRaw(noise, {"--text", "--threshold", std::to_string(threshold)});
    EXPECT_EQ(run.exitCode, 0) << run.errors;
    EXPECT_EQ(run.output, engineText(noise, 9, threshold, true)) << threshold;
  }
  EXPECT_EQ(onRaw(noise, {"--text", "--threshold", "255"}).output, "");
}

TEST_F(Keypoints, SeeTheGreenChannelAlone) {
  Image<RGBA8Pixel> flatGreen = noisePicture(64, 48, 7);
  for (std::size_t i = 0; i < flatGreen.pixelCount(); ++i) flatGreen.data.get()[i].g = 99;
  EXPECT_EQ(onRaw(flatGreen, {"--text"}).output, "");
}

TEST_F(Keypoints, HaveTheEnginesDescriptorsWhereTheyHaveOne) {
  const auto descriptors = image_processing::computeBriefDescriptors(greenOf(picture), 20);
  ASSERT_FALSE(descriptors.empty());
  const std::string expected = engineText(
      picture, 9, 20, true, [&](const xy& corner) { return hexBehind(descriptors, corner); });
  EXPECT_EQ(onRaw(picture, {"--text", "--brief"}).output, expected);

  const nlohmann::json json = parsedJson(onRaw(picture, {"--json", "--brief"}).output);
  std::string fromJson;
  std::size_t described = 0;
  for (const auto& corner : json["corners"]) {
    fromJson += corner["x"].dump() + " " + corner["y"].dump() + " " + corner["score"].dump();
    if (corner.contains("descriptor")) {
      ++described;
      fromJson.append(" ").append(corner["descriptor"].get<std::string>());
    }
    fromJson += "\n";
  }
  EXPECT_EQ(fromJson, expected);
  EXPECT_EQ(described, descriptors.size());
  EXPECT_LT(described, json["corners"].size());
}

TEST_F(Keypoints, AreDescribedForEveryKindOfCorner) {
  const Finished run =
      onRaw(picture, {"--text", "--brief", "--n", "12", "--no-suppression", "--threshold", "5"});
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  const Image<unsigned char> grey = greenOf(picture);
  int count = 0;
  const std::unique_ptr<xy[], decltype(&std::free)> corners(
      fast12_detect(grey.data.get(), 173, 91, 173, 5, &count), std::free);
  std::vector<BriefDescriptor> descriptors;
  image_processing::brief(corners.get(), count, grey, descriptors);
  ASSERT_FALSE(descriptors.empty());
  EXPECT_EQ(run.output, engineText(picture, 12, 5, false, [&](const xy& corner) {
              return hexBehind(descriptors, corner);
            }));
}

TEST_F(Keypoints, SayAsJsonHowTheyWereFound) {
  const nlohmann::json json = parsedJson(
      onRaw(picture, {"--json", "--n", "10", "--threshold", "7", "--no-suppression"}).output);
  EXPECT_EQ(json["file"], folder / "in.rgba");
  EXPECT_EQ(json["width"], 173);
  EXPECT_EQ(json["height"], 91);
  EXPECT_EQ(json["n"], 10);
  EXPECT_EQ(json["threshold"], 7);
  EXPECT_EQ(json["suppressed"], false);
  EXPECT_EQ(json["count"], json["corners"].size());
  EXPECT_GT(json["count"], 0);
  EXPECT_FALSE(json["corners"][0].contains("descriptor"));
}

TEST_F(Keypoints, AreSummedUpForAPerson) {
  const std::string text = engineText(picture, 9, 20, true);
  const auto count = std::count(text.begin(), text.end(), '\n');
  const Finished run = onRaw(picture, {"--brief"});
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_THAT(run.output, HasSubstr("173 x 91"));
  EXPECT_THAT(run.output, HasSubstr(std::to_string(count) + " corners (FAST-9, threshold 20)"));
  EXPECT_THAT(run.output, HasSubstr("median"));
  const auto descriptors = image_processing::computeBriefDescriptors(greenOf(picture), 20);
  EXPECT_THAT(run.output, HasSubstr("descriptors  " + std::to_string(descriptors.size()) + ","));
}

TEST_F(Keypoints, AreNoneInATinyPicture) {
  for (const auto& size : {std::pair{6, 40}, {40, 6}, {1, 1}, {7, 7}}) {
    const auto tiny = flatPicture(static_cast<std::uint32_t>(size.first),
                                  static_cast<std::uint32_t>(size.second), {1, 2, 3, 4});
    const Finished run = onRaw(tiny, {"--brief", "--text"});
    EXPECT_EQ(run.exitCode, 0) << run.errors;
    EXPECT_EQ(run.output, "");
  }
  EXPECT_THAT(onRaw(flatPicture(6, 6, {}), {}).output, HasSubstr("0 corners"));
  EXPECT_THAT(onRaw(flatPicture(6, 6, {}), {"--json"}).output, HasSubstr("\"corners\": []"));
}

TEST_F(Keypoints, AreThoseOfTheUprightPicture) {
  const Bytes exif = exifPayload({6, "", "", ""}, false);
  const Bytes file = jpegOf(picture, {{0xE1, exif}});
  const Image<RGBA8Pixel> stored = decoded(file);
  const Image<RGBA8Pixel> upright(stored.height, stored.width);
  photo::turnRows(stored.row(0), 0, stored.height, {stored.width, stored.height},
                  photo::uprightTurn(6), upright);
  const Finished run = quenby({"keypoints", "--text", "-"}, file);
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_EQ(run.output, engineText(upright, 9, 20, true));
}

TEST_F(Keypoints, AreDrawnOverThePhoto) {
  const auto colourful = [&](const std::string& name) {
    const Image<RGBA8Pixel> drawing = *photo::open(folder.read(name)).image;
    int pixels = 0;
    for (std::uint32_t y = 90; y + 120 < drawing.height; ++y) {
      for (std::uint32_t x = 0; x < drawing.width; ++x) {
        pixels += std::abs(drawing.row(y)[x].r - drawing.row(y)[x].b) > 60;
      }
    }
    return pixels;
  };
  Image<RGBA8Pixel> grey = picture;
  for (std::size_t i = 0; i < grey.pixelCount(); ++i) {
    const std::uint8_t green = grey.data.get()[i].g;
    grey.data.get()[i] = {green, green, green, 255};
  }
  ASSERT_EQ(onRaw(grey, {"--draw", folder / "some.png"}).exitCode, 0);
  ASSERT_EQ(onRaw(grey, {"--draw", folder / "none.png", "--threshold", "255"}).exitCode, 0);
  EXPECT_EQ(colourful("none.png"), 0);
  EXPECT_GT(colourful("some.png"), 100);
}

TEST_F(Keypoints, AreDrawnOverAnOldFileOnlyWhenAsked) {
  const std::string drawing = folder.write("old.png", std::string("old"));
  const Finished kept = onRaw(picture, {"--draw", drawing});
  EXPECT_EQ(kept.exitCode, 3);
  EXPECT_THAT(kept.errors, HasSubstr("old.png: exists already; add --overwrite"));
  EXPECT_EQ(folder.read("old.png").size(), 3u);
  EXPECT_EQ(onRaw(picture, {"--draw", drawing, "--overwrite"}).exitCode, 0);
  EXPECT_GT(photo::open(folder.read("old.png")).image->width, 0u);
}

TEST_F(Keypoints, OfABadFileAreOneLineAndLeaveNothing) {
  const Bytes good = smallJpeg();
  const Bytes half(good.begin(), good.begin() + static_cast<std::ptrdiff_t>(good.size() / 2));
  for (const std::string& input :
       {folder / "missing.jpg", folder.write("text.jpg", std::string("x")),
        folder.write("half.jpg", half), folder.write("empty.jpg", std::string())}) {
    const Finished run = quenby({"keypoints", input, "--draw", folder / "out.png"});
    EXPECT_EQ(run.exitCode, 1) << input;
    EXPECT_THAT(run.errors, testing::StartsWith("quenby keypoints: " + input + ": "));
    EXPECT_EQ(std::count(run.errors.begin(), run.errors.end(), '\n'), 1) << run.errors;
    EXPECT_THAT(run.output, IsEmpty());
  }
  EXPECT_FALSE(folder.has("out.png"));
}

TEST_F(Keypoints, RefuseWhatTheyCannotMean) {
  const std::vector<std::vector<std::string>> usages = {
      {"--n", "8"},
      {"--n", "13"},
      {"--n", "9.5"},
      {"--n", "x"},
      {"--threshold", "-1"},
      {"--threshold", "256"},
      {"--threshold", "1e9"},
      {"--text", "--json"},
      {"--text", "--jsonl"},
      {"--draw", "-"},
      {"--draw", folder / "none/out.png"},
      {"--overwrite"},
      {"other.jpg"},
  };
  for (const auto& options : usages) {
    const Finished run = onRaw(noise, options);
    EXPECT_EQ(run.exitCode, 2) << options[0] << " " << options.back();
    EXPECT_THAT(run.output, IsEmpty());
    EXPECT_EQ(std::count(run.errors.begin(), run.errors.end(), '\n'), 1) << run.errors;
  }
  EXPECT_EQ(quenby({"keypoints"}).exitCode, 2);
  EXPECT_EQ(quenby({"keypoints", folder.path()}).exitCode, 2);
  EXPECT_EQ(onRaw(noise, {"--draw", folder / "in.rgba"}).exitCode, 2);
}

}  // namespace
}  // namespace pelorin::test_support
