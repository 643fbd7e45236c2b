#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstring>

#include "cli/frame/faces.h"
#include "cli/pictures/grey_picture.h"
#include "image_processing/autoenhance/masks/image_masks.h"
#include "photo/photo.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using image_processing::FilterConfig;
using image_processing::ImageMasks;
using image_processing::QuantizedFloat;
using testing::HasSubstr;
using testing::UnorderedElementsAre;
using Byte = QuantizedFloat<unsigned char>;

Bytes memoryOf(const void* data, std::size_t count) {
  const auto* first = static_cast<const std::uint8_t*>(data);
  return {first, first + count};
}

template <typename T>
Bytes memoryOf(const Image<T>& image) {
  return memoryOf(image.data.get(), image.byteSize());
}

const image_processing::ImageMetadata noFaces;

image_processing::ImageMetadata facesOf(const std::vector<std::string>& texts,
                                        const Image<RGBA8Pixel>& picture) {
  return cli::metadataWithFaces(cli::readFaces(texts), picture.width, picture.height);
}

/// The masks straight from the engine, as floats.
template <typename T>
std::pair<Image<float>, Image<float>> masksOf(const Image<RGBA8Pixel>& picture,
                                              const image_processing::ImageMetadata& metadata,
                                              bool grid = true) {
  FilterConfig config = image_processing::defaultFilterConfigValue;
  config.useBilateralGrid = grid ? 1 : 0;
  ImageMasks<T, T> masks;
  image_processing::computeImageMasks(picture, metadata, config, masks);
  const auto floats = [](const Image<T>& mask) {
    Image<float> plane(mask.width, mask.height);
    std::copy_n(mask.data.get(), mask.pixelCount(), plane.data.get());
    return plane;
  };
  return {floats(*masks.bilateralMask), floats(*masks.ltmMask)};
}

class MasksVerb : public testing::Test {
 protected:
  /// Runs `quenby masks` on raw pixels.
  Finished onRaw(const Image<RGBA8Pixel>& picture, std::vector<std::string> options = {}) {
    const std::string input = folder.write("in.rgba", memoryOf(picture));
    std::vector<std::string> arguments = {
        "masks", input,   "-o",
        out,     "--raw", std::to_string(picture.width) + "x" + std::to_string(picture.height)};
    arguments.insert(arguments.end(), options.begin(), options.end());
    return quenby(arguments);
  }

  template <typename Planes>
  void expectPlanes(const Planes& expected) {
    EXPECT_EQ(folder.read("out/bilateral.f32"), memoryOf(expected.first));
    EXPECT_EQ(folder.read("out/ltm.f32"), memoryOf(expected.second));
  }

  const TemporaryFolder folder;
  const std::string out = folder.makeFolder("out");
  const Image<RGBA8Pixel> picture = photoLikePicture(97, 61, 3);
};

TEST_F(MasksVerb, AreTheEnginesOwnByteForByteAsRawPlanes) {
  const Finished run = onRaw(picture);
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_EQ(run.output, "");
  EXPECT_EQ(run.errors, "");
  expectPlanes(masksOf<float>(picture, noFaces));
}

TEST_F(MasksVerb, SeeEveryFace) {
  const std::vector<std::string> faces = {"0.1,0.2,0.5,0.9", "0.4,-0.5,1.7,0.6"};
  ASSERT_EQ(onRaw(picture, {"--face", faces[0], "--face", faces[1]}).exitCode, 0);
  const auto expected = masksOf<float>(picture, facesOf(faces, picture));
  expectPlanes(expected);
  EXPECT_NE(memoryOf(expected.second), memoryOf(masksOf<float>(picture, noFaces).second));
}

TEST_F(MasksVerb, OfTheSmallFilterAreItsBytesOver255) {
  ASSERT_EQ(onRaw(picture, {"--filter", "AE08bit"}).exitCode, 0);
  expectPlanes(masksOf<Byte>(picture, noFaces));
}

TEST_F(MasksVerb, AreSmoothedExactlyOnRequest) {
  ASSERT_EQ(onRaw(picture, {"--exact"}).exitCode, 0);
  const auto expected = masksOf<float>(picture, noFaces, /*grid=*/false);
  expectPlanes(expected);
  EXPECT_NE(memoryOf(expected.first), memoryOf(masksOf<float>(picture, noFaces).first));
}

TEST_F(MasksVerb, OfThinPicturesAreTheEnginesToo) {
  for (const bool wide : {true, false}) {
    const auto thin = photoLikePicture(wide ? 65500 : 1, wide ? 1 : 65500, 4);
    ASSERT_EQ(onRaw(thin, {"--overwrite"}).exitCode, 0);
    expectPlanes(masksOf<float>(thin, noFaces));
  }
}

TEST_F(MasksVerb, OfAJpegFileArePicturesOfItsSize) {
  const Bytes file = jpegOf(picture);
  const Finished run = quenby({"masks", folder.write("a.jpg", file), "-o", out});
  ASSERT_EQ(run.exitCode, 0) << run.errors;
  const auto expected = masksOf<float>(decoded(file), noFaces);
  const auto expectGrey = [&](const std::string& name, const Image<float>& mask) {
    const auto shown = *photo::open(folder.read(name)).image;
    EXPECT_EQ(photo::readFacts(folder.read(name)).channels, 1);
    const auto grey = cli::greyPicture(mask);
    ASSERT_EQ(shown.width, mask.width);
    ASSERT_EQ(shown.height, mask.height);
    for (std::size_t i = 0; i < grey.pixelCount(); ++i) {
      ASSERT_EQ(shown.data.get()[i], grey.data.get()[i]);
    }
  };
  expectGrey("out/bilateral.png", expected.first);
  expectGrey("out/ltm.png", expected.second);
}

TEST_F(MasksVerb, ComeFromStandardInputToo) {
  ASSERT_EQ(quenby({"masks", "-", "-o", out}, jpegOf(picture)).exitCode, 0);
  EXPECT_THAT(folder.content(), UnorderedElementsAre("out/", "out/bilateral.png", "out/ltm.png"));
}

TEST_F(MasksVerb, TellWhatWasMadeAsJson) {
  const Finished run = onRaw(picture, {"--json"});
  EXPECT_THAT(run.output, HasSubstr("\"width\": 97"));
  EXPECT_THAT(run.output, HasSubstr("\"filter\": \"AE0\""));
  EXPECT_THAT(run.output, HasSubstr("ltm.f32\""));
}

TEST_F(MasksVerb, AreNotReplacedUnasked) {
  folder.write("out/ltm.f32", "old");
  const Finished run = onRaw(picture);
  EXPECT_EQ(run.exitCode, 3);
  EXPECT_THAT(run.errors, HasSubstr("ltm.f32: exists already; add --overwrite"));
  EXPECT_EQ(folder.read("out/ltm.f32"), (Bytes{'o', 'l', 'd'}));
  EXPECT_FALSE(folder.has("out/bilateral.f32"));
  EXPECT_EQ(onRaw(picture, {"--overwrite"}).exitCode, 0);
  expectPlanes(masksOf<float>(picture, noFaces));
}

TEST_F(MasksVerb, AreOnlyPlannedOnRequest) {
  const Finished run = onRaw(picture, {"-n"});
  EXPECT_EQ(run.exitCode, 0);
  EXPECT_THAT(run.output, HasSubstr("in.rgba -> " + out + "/bilateral.f32\n"));
  EXPECT_THAT(folder.content(), UnorderedElementsAre("out/", "in.rgba"));
}

TEST_F(MasksVerb, OfAFilterWithoutAnyAreRefused) {
  for (const char* name : {"PassThrough", "ae0", "AE1", ""}) {
    const Finished run = onRaw(picture, {"--filter", name});
    EXPECT_EQ(run.exitCode, 2) << name;
  }
  EXPECT_THAT(onRaw(picture, {"--filter", "ae0"}).errors, HasSubstr("did you mean 'AE0'?"));
  EXPECT_THAT(folder.content(), UnorderedElementsAre("out/", "in.rgba"));
}

TEST_F(MasksVerb, NeedAFolder) {
  const std::string input = folder.write("a.jpg", smallJpeg());
  EXPECT_EQ(quenby({"masks", input, "-o", input}).exitCode, 2);
  EXPECT_EQ(quenby({"masks", input}).exitCode, 2);
}

TEST_F(MasksVerb, OfABadFileLeaveNothingBehind) {
  const Bytes good = smallJpeg();
  const Bytes half(good.begin(), good.begin() + static_cast<std::ptrdiff_t>(good.size() / 2));
  for (const std::string& input :
       {folder / "missing.jpg", folder.write("text.jpg", "not a picture"),
        folder.write("half.jpg", half), folder.write("empty.jpg", "")}) {
    const Finished run = quenby({"masks", input, "-o", out});
    EXPECT_EQ(run.exitCode, 1) << input;
    EXPECT_THAT(run.errors, testing::StartsWith("quenby masks: " + input + ": "));
    EXPECT_EQ(std::count(run.errors.begin(), run.errors.end(), '\n'), 1) << run.errors;
  }
  EXPECT_EQ(quenby({"masks", folder.path(), "-o", out}).exitCode, 2);
  EXPECT_TRUE(std::filesystem::is_empty(out));
}

TEST_F(MasksVerb, ThatDoNotBothFitLeaveNothingBehind) {
  const std::string command = "$QUENBY masks '" +
                              folder.write("a.jpg", jpegOf(photoLikePicture(400, 300, 3))) +
                              "' -o '" + out + "'";
  ASSERT_EQ(shell(command).exitCode, 0);
  const std::size_t first = folder.read("out/bilateral.png").size();
  ASSERT_LT(first + 512, folder.read("out/ltm.png").size());
  std::filesystem::remove(folder / "out/bilateral.png");
  std::filesystem::remove(folder / "out/ltm.png");
  const Finished full = shell("ulimit -f " + std::to_string(first / 512 + 1) + "; " + command);
  EXPECT_EQ(full.exitCode, 1);
  EXPECT_THAT(full.errors, HasSubstr("ltm.png cannot be written"));
  EXPECT_TRUE(std::filesystem::is_empty(out));
}

TEST_F(MasksVerb, OfTheWrongNumberOfBytesAreRefused) {
  const std::string input = folder.write("in.rgba", Bytes(97 * 61 * 4 - 1));
  EXPECT_EQ(quenby({"masks", input, "-o", out, "--raw", "97x61"}).exitCode, 1);
  EXPECT_EQ(quenby({"masks", input, "-o", out, "--raw", "0x61"}).exitCode, 2);
  EXPECT_EQ(quenby({"masks", input, "-o", out, "--raw", "4294967295x4294967295"}).exitCode, 1);
  EXPECT_TRUE(std::filesystem::is_empty(out));
}

}  // namespace
}  // namespace pelorin::test_support
