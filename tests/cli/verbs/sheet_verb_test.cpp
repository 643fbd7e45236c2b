#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "photo/area_average.h"
#include "tests/cli/parsed_json.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/exif_payload.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using testing::HasSubstr;
using testing::UnorderedElementsAre;

constexpr std::uint32_t cell = 160;

/// Where a sheet's first row of pictures starts, and how far its columns are apart.
constexpr std::uint32_t left = 24, firstTop = 24 + 30 + 28, columnGap = 12;

Bytes flatJpeg(std::uint32_t width, std::uint32_t height, const RGBA8Pixel& colour) {
  return jpegOf(flatPicture(width, height, colour));
}

/// Mean difference between a part of the sheet and the picture that should be there.
double difference(const Image<RGBA8Pixel>& sheet, std::uint32_t x, std::uint32_t y,
                  const Image<RGBA8Pixel>& picture) {
  double sum = 0;
  for (std::uint32_t row = 0; row < picture.height; ++row) {
    for (std::uint32_t column = 0; column < picture.width; ++column) {
      const RGBA8Pixel &a = sheet.row(y + row)[x + column], b = picture.row(row)[column];
      sum += std::abs(a.r - b.r) + std::abs(a.g - b.g) + std::abs(a.b - b.b);
    }
  }
  return sum / 3 / static_cast<double>(picture.pixelCount());
}

Image<RGBA8Pixel> enhanced(const Image<RGBA8Pixel>& picture, const std::string& params) {
  auto source = std::make_shared<Image<RGBA8Pixel>>(picture);
  image_processing::FilteredImage session(source, {}, "",
                                          image_processing::defaultFilterConfigValue,
                                          image_processing::DefaultFilterFactory::filterFactory());
  Image<RGBA8Pixel> output(picture.width, picture.height);
  EXPECT_TRUE(session.applyFilterWithParams("AE0", params,
                                            image_processing::defaultFilterConfigValue, output));
  return output;
}

class SheetVerb : public testing::Test {
 protected:
  Finished run(std::vector<std::string> inputs, std::vector<std::string> options) {
    std::vector<std::string> arguments = {"sheet",     "-o", folder / "sheet.jpg", "--cell", "160",
                                          "--quality", "100"};
    arguments.insert(arguments.end(), options.begin(), options.end());
    arguments.insert(arguments.end(), inputs.begin(), inputs.end());
    return quenby(arguments);
  }
  Image<RGBA8Pixel> sheet() { return decoded(folder.read("sheet.jpg")); }

  const TemporaryFolder folder;
};

TEST_F(SheetVerb, ShowsThePhotoAndThenEverySlider) {
  const Bytes file = jpegOf(photoLikePicture(400, 300, 2), {}, 95);
  const Finished finished = run({folder.write("a.jpg", file)}, {"--sliders", "0.3,1"});
  ASSERT_EQ(finished.exitCode, 0) << finished.errors;
  EXPECT_EQ(finished.output, "");
  const auto picture = decoded(file), shown = sheet();
  const photo::PictureSize size{160, 120};
  EXPECT_EQ(shown.width, 2 * left + 3 * cell + 2 * columnGap);
  const auto at = [](std::uint32_t column) { return left + column * (cell + columnGap); };
  EXPECT_LT(difference(shown, at(0), firstTop, photo::areaAverage(picture, size)), 3);
  const auto low = photo::areaAverage(enhanced(picture, "slider=0.3;"), size);
  const auto high = photo::areaAverage(enhanced(picture, "slider=1;"), size);
  EXPECT_LT(difference(shown, at(1), firstTop, low), 3);
  EXPECT_LT(difference(shown, at(2), firstTop, high), 3);
  EXPECT_GT(difference(shown, at(2), firstTop, low), 5);
}

TEST_F(SheetVerb, ShowsWhatFacesChange) {
  Image<RGBA8Pixel> portrait = photoLikePicture(400, 300, 2);
  for (std::uint32_t y = 30; y < 270; ++y) {  // a face of wrinkles, which smoothing spares
    for (std::uint32_t x = 40; x < 160; ++x) {
      const std::uint8_t red = (x / 6 + y / 6) % 2 == 0 ? 220 : 160;
      portrait.row(y)[x] = {red, 150, 120, 255};
    }
  }
  const Bytes file = jpegOf(portrait, {}, 95);
  const std::string input = folder.write("a.jpg", file);
  const Finished finished =
      run({input}, {"--sliders", "1", "--without-faces", "--face", "0.1,0.1,0.4,0.9"});
  ASSERT_EQ(finished.exitCode, 0) << finished.errors;
  const auto picture = decoded(file), shown = sheet();
  const auto at = [](std::uint32_t column) { return left + column * (cell + columnGap); };
  EXPECT_EQ(shown.width, 2 * left + 3 * cell + 2 * columnGap);
  const auto without = photo::areaAverage(enhanced(picture, "slider=1;"), {160, 120});
  const double coding = difference(shown, at(1), firstTop, without);
  EXPECT_LT(coding, 3);
  EXPECT_GT(difference(shown, at(2), firstTop, without), 1.5 * coding);
  const RGBA8Pixel frame = shown.row(firstTop + 60)[at(0) + 16];
  EXPECT_GT(frame.r + frame.g + frame.b, 3 * 200);
}

TEST_F(SheetVerb, TurnsPhotosUpright) {
  const Bytes exif = exifPayload({6, "", "", ""}, true);  // to be shown turned clockwise
  const auto picture = photoLikePicture(400, 300, 6);
  const std::string input = folder.write("a.jpg", jpegOf(picture, {{0xE1, exif}}, 95));
  ASSERT_EQ(run({input}, {"--looks", "Auto"}).exitCode, 0);
  Image<RGBA8Pixel> upright(300, 400);
  for (std::uint32_t y = 0; y < 400; ++y) {
    for (std::uint32_t x = 0; x < 300; ++x) upright.row(y)[x] = picture.row(299 - x)[y];
  }
  EXPECT_LT(difference(sheet(), left, firstTop, photo::areaAverage(upright, {120, 160})), 4);
}

TEST_F(SheetVerb, HasARowForEveryPhotoInTheirOrder) {
  const RGBA8Pixel red{200, 30, 30, 255}, green{30, 160, 60, 255}, blue{40, 60, 190, 255};
  const std::vector<std::string> inputs = {folder.write("a.jpg", flatJpeg(200, 160, red)),
                                           folder.write("b.jpg", flatJpeg(160, 200, green)),
                                           folder.write("c.jpg", flatJpeg(400, 100, blue))};
  for (const char* jobs : {"1", "3"}) {
    ASSERT_EQ(run(inputs, {"--looks", "AE0", "-j", jobs, "--overwrite"}).exitCode, 0);
    const auto shown = sheet();
    const std::uint32_t between = 26 + 18 + 28;  // label, gap, name
    std::uint32_t top = firstTop;
    EXPECT_LT(difference(shown, left, top, flatPicture(160, 128, red)), 3);
    top += 128 + between;
    EXPECT_LT(difference(shown, left + 16, top, flatPicture(128, 160, green)), 3);
    top += 160 + between;
    EXPECT_LT(difference(shown, left, top, flatPicture(160, 40, blue)), 3);
    EXPECT_EQ(shown.height, top + 40 + 26 + 18);
  }
}

TEST_F(SheetVerb, HasAColumnForEveryLookButTheUntouchedOne) {
  const std::string input = folder.write("a.jpg", flatJpeg(160, 160, {90, 90, 90, 255}));
  const auto looks =
      image_processing::DefaultFilterFactory::filterFactory()->descriptions.size() - 1;
  const auto width = [](std::size_t columns) {
    return 2 * left + (columns + 1) * cell + columns * columnGap;
  };
  ASSERT_EQ(run({input}, {"--all-looks"}).exitCode, 0);
  EXPECT_EQ(sheet().width, width(looks));
  ASSERT_EQ(run({input}, {"--overwrite"}).exitCode, 0);
  EXPECT_EQ(sheet().width, width(looks));
  ASSERT_EQ(run({input}, {"--overwrite", "--looks", "ae08BIT,auto,Original"}).exitCode, 0);
  EXPECT_EQ(sheet().width, width(2));
  ASSERT_EQ(run({input}, {"--overwrite", "--looks", "Auto", "--sliders", "0,1"}).exitCode, 0);
  EXPECT_EQ(sheet().width, width(3));
}

TEST_F(SheetVerb, KnowsLooksByBothNamesInAnyCase) {
  const std::string input = folder.write("a.jpg", smallJpeg());
  ASSERT_EQ(run({input}, {"--looks", "ZebraBW,LowDimRGBCurve,WinterRGB"}).exitCode, 0);
  const Bytes expected = folder.read("sheet.jpg");
  for (const char* looks : {"snow,STARFISH,Winter", "zebrabw,starFish,WINTERRGB"}) {
    ASSERT_EQ(run({input}, {"--looks", looks, "--overwrite"}).exitCode, 0);
    EXPECT_EQ(folder.read("sheet.jpg"), expected) << looks;
  }
}

TEST_F(SheetVerb, ReadsRawPixelsAndStandardInput) {
  const auto picture = photoLikePicture(120, 90, 8);
  const Bytes pixels(&picture.data.get()->r, &picture.data.get()->r + picture.byteSize());
  ASSERT_EQ(
      run({folder.write("in.rgba", pixels)}, {"--raw", "120x90", "--sliders", "0.5"}).exitCode, 0);
  EXPECT_LT(difference(sheet(), left, firstTop, picture), 3);
  EXPECT_EQ(
      quenby({"sheet", "-", "-o", folder / "two.jpg", "--sliders", "1"}, smallJpeg()).exitCode, 0);
  EXPECT_TRUE(folder.has("two.jpg"));
}

TEST_F(SheetVerb, GoesToStandardOutput) {
  const std::string input = folder.write("a.jpg", smallJpeg());
  const Finished finished = quenby({"sheet", input, "-o", "-", "--sliders", "1"});
  EXPECT_EQ(finished.exitCode, 0);
  EXPECT_GT(decoded({finished.output.begin(), finished.output.end()}).width, 100u);
  EXPECT_EQ(quenby({"sheet", input, "-o", "-", "--json"}).exitCode, 2);
}

TEST_F(SheetVerb, TakesThinPhotos) {
  const std::vector<std::string> inputs = {
      folder.write("wide.jpg", flatJpeg(65500, 1, {200, 30, 30, 255})),
      folder.write("high.jpg", flatJpeg(1, 65500, {200, 30, 30, 255}))};
  const Finished finished = run(inputs, {"--sliders", "0.4"});
  ASSERT_EQ(finished.exitCode, 0) << finished.errors;
  EXPECT_EQ(sheet().height, firstTop + 1 + (26 + 18 + 28) + 160 + 26 + 18);
}

TEST_F(SheetVerb, ShowsAnEmptyRowForABadFileAndSaysSo) {
  const Bytes good = smallJpeg();
  const Bytes half(good.begin(), good.begin() + static_cast<std::ptrdiff_t>(good.size() / 2));
  const std::vector<std::string> inputs = {folder.write("half.jpg", half), folder / "missing.jpg",
                                           folder.write("good.jpg", good)};
  const Finished finished = run(inputs, {"--sliders", "1", "--json"});
  EXPECT_EQ(finished.exitCode, 1);
  EXPECT_THAT(finished.errors, HasSubstr("quenby sheet: " + inputs[0] + ": "));
  EXPECT_THAT(finished.errors, HasSubstr("quenby sheet: " + inputs[1] + ": "));
  EXPECT_EQ(std::count(finished.errors.begin(), finished.errors.end(), '\n'), 2);
  const auto json = parsedJson(finished.output);
  EXPECT_EQ(json.at("photos").at(0).at("status"), "failed");
  EXPECT_EQ(json.at("photos").at(2).at("status"), "done");
  EXPECT_EQ(json.at("height"), sheet().height);
}

TEST_F(SheetVerb, OfBadFilesOnlyIsNotMade) {
  const Finished finished = run({folder / "missing.jpg", folder.write("text.jpg", "text")}, {});
  EXPECT_EQ(finished.exitCode, 1);
  EXPECT_THAT(folder.content(), UnorderedElementsAre("text.jpg"));
}

TEST_F(SheetVerb, NamesTheNearestOfAnUnknownLook) {
  const std::string input = folder.write("a.jpg", smallJpeg());
  const Finished finished = run({input}, {"--looks", "Autos"});
  EXPECT_EQ(finished.exitCode, 2);
  EXPECT_THAT(finished.errors, HasSubstr("unknown look 'Autos'; did you mean 'Auto'?"));
  EXPECT_EQ(run({input}, {"--looks", ""}).exitCode, 2);
  EXPECT_EQ(run({input}, {"--looks", "Auto", "--all-looks"}).exitCode, 2);
  EXPECT_THAT(folder.content(), UnorderedElementsAre("a.jpg"));
}

TEST_F(SheetVerb, RefusesSlidersOutsideTheirRange) {
  const std::string input = folder.write("a.jpg", smallJpeg());
  for (const char* sliders : {"0,1.5", "-1", "nan", "a"}) {
    EXPECT_EQ(run({input}, {"--sliders", sliders}).exitCode, 2) << sliders;
  }
  EXPECT_EQ(run({input}, {"--slider", "2"}).exitCode, 2);
}

TEST_F(SheetVerb, RefusesOutputsThatAreNoPlaceForIt) {
  const std::string input = folder.write("a.jpg", smallJpeg());
  for (const std::string& output : {folder.path(), folder / "no/sheet.jpg", input, std::string()}) {
    const Finished finished = quenby({"sheet", input, "-o", output, "--overwrite"});
    EXPECT_EQ(finished.exitCode, 2) << output;
    EXPECT_EQ(std::count(finished.errors.begin(), finished.errors.end(), '\n'), 1);
  }
  EXPECT_EQ(quenby({"sheet", input}).exitCode, 2);
  EXPECT_EQ(folder.read("a.jpg"), smallJpeg());
}

TEST_F(SheetVerb, KeepsAnOldSheetUnlessTold) {
  const std::string input = folder.write("a.jpg", smallJpeg());
  folder.write("sheet.jpg", "old");
  EXPECT_EQ(run({input}, {}).exitCode, 3);
  const Finished full = shell("ulimit -f 1; $QUENBY sheet '" + input + "' --overwrite -o '" +
                              (folder / "sheet.jpg") + "'");
  EXPECT_EQ(full.exitCode, 1);
  EXPECT_THAT(full.errors, HasSubstr("sheet.jpg cannot be written"));
  EXPECT_EQ(folder.read("sheet.jpg"), (Bytes{'o', 'l', 'd'}));
  EXPECT_THAT(folder.content(), UnorderedElementsAre("a.jpg", "sheet.jpg"));
}

TEST_F(SheetVerb, IsOnlyPlannedOnRequest) {
  const std::string input = folder.write("a.jpg", smallJpeg());
  EXPECT_EQ(run({input}, {"-n"}).output, input + " -> " + (folder / "sheet.jpg") + "\n");
  EXPECT_EQ(parsedJson(run({input}, {"-n", "--json"}).output).at("status"), "planned");
  EXPECT_THAT(folder.content(), UnorderedElementsAre("a.jpg"));
}

TEST_F(SheetVerb, HasNothingToDoWithoutPhotos) {
  EXPECT_EQ(run({folder.makeFolder("empty")}, {"-r"}).exitCode, 3);
}

TEST_F(SheetVerb, RefusesToGrowBeyondAPicture) {
  const std::string input = folder.write("a.jpg", flatJpeg(4096, 8, {90, 90, 90, 255}));
  const Finished finished = quenby({"sheet", input, "-o", folder / "sheet.jpg", "--cell", "4096",
                                    "--sliders", "0,0.1,0.2,0.3,0.4,0.5,0.6,0.7"});
  EXPECT_EQ(finished.exitCode, 2);
  EXPECT_THAT(finished.errors, HasSubstr("smaller --cell"));
}

}  // namespace
}  // namespace pelorin::test_support
