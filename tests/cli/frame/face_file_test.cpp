#include "cli/frame/face_file.h"

#include <gmock/gmock.h>

#include "cli/frame/errors.h"
#include "tests/support/temporary_folder.h"

namespace pelorin::cli {
namespace {

using test_support::TemporaryFolder;

std::string written(const TemporaryFolder& folder, const std::string& text) {
  return folder.write("faces.json", text);
}

FaceFile read(const std::string& text) {
  const TemporaryFolder folder;
  return readFaceFile(written(folder, text));
}

// What is refused with the file's own path left out.
std::string refusal(const std::string& text) {
  const TemporaryFolder folder;
  const std::string path = written(folder, text);
  try {
    readFaceFile(path);
  } catch (const UsageError& error) {
    const std::string message = error.what(), begin = "--faces: " + path + ": ";
    EXPECT_EQ(message.substr(0, begin.size()), begin);
    return message.substr(std::min(begin.size(), message.size()));
  }
  return "nothing";
}

const std::string face = R"({"left": 0.25, "top": 0.125, "right": 0.5, "bottom": 0.375})";

TEST(FaceFile, IsForEveryPhoto) {
  const FaceFile file = read(R"({"faces": [)" + face + R"(, {"left": -0.5, "top": 0, "right": 1,
      "bottom": 1.5, "name": "Ada"}], "file": "x.jpg", "width": 7})");
  const std::vector<Face>& faces = file.of("any.jpg");
  ASSERT_EQ(faces.size(), 2u);
  EXPECT_EQ(faces[0].left, 0.25f);
  EXPECT_EQ(faces[0].top, 0.125f);
  EXPECT_EQ(faces[0].right, 0.5f);
  EXPECT_EQ(faces[0].bottom, 0.375f);
  EXPECT_FALSE(faces[0].inPixels);
  EXPECT_EQ(faces[1].left, -0.5f);
  EXPECT_TRUE(read(R"({"faces": []})").of("any.jpg").empty());
}

TEST(FaceFile, OrForEachPhotoByItsPath) {
  const FaceFile file = read(R"([{"file": "./a/b.jpg", "faces": [)" + face +
                             R"(]}, {"file": "c.jpg", "faces": []}])");
  EXPECT_EQ(file.of("a/b.jpg").size(), 1u);
  EXPECT_EQ(file.of("a/./b.jpg").size(), 1u);
  EXPECT_TRUE(file.of("./c.jpg").empty());
  EXPECT_THROW(file.of("b.jpg"), FileError);
}

TEST(FaceFile, ThatIsWrongIsRefusedWithThePlace) {
  EXPECT_EQ(refusal(""), "is no JSON at byte 1");
  EXPECT_EQ(refusal("{\"faces\": [}"), "is no JSON at byte 12");
  EXPECT_EQ(refusal("\xFF"), "is no JSON at byte 1");
  EXPECT_EQ(refusal("7"), "is no object with a list of \"faces\"");
  EXPECT_EQ(refusal(R"({"faces": {}})"), "is no object with a list of \"faces\"");
  EXPECT_EQ(refusal(R"({"faces": [)" + face + ", 7]}"),
            "faces[1]: is no object with left, top, right and bottom");
  EXPECT_EQ(refusal(R"({"faces": [{"left": 0.1}]})"), "faces[0]: has no 'top'");
  EXPECT_EQ(refusal(R"({"faces": [{"left": "0.1"}]})"), "faces[0]: 'left' is no number");
  EXPECT_EQ(refusal(R"({"faces": [{"left": 120}]})"),
            "faces[0]: 'left' is no fraction of the picture, from 0 to 1");
  EXPECT_EQ(refusal(R"({"faces": [{"left": 1e999}]})"), "has a number that is too large");
  EXPECT_EQ(refusal(R"({"faces": [{"left": 0, "top": 0, "right": 1, "bottom": 1, "Name": ""}]})"),
            "faces[0]: has 'Name', which is none of left, top, right, bottom, name");
  EXPECT_THAT(refusal(R"({"faces": [{"left": 0.5, "top": 0, "right": 0.4, "bottom": 1}]})"),
              testing::HasSubstr("faces[0]: has its left side right of its right one"));
  EXPECT_EQ(refusal(R"({"faces": [{"left": 1.1, "top": 0, "right": 1.2, "bottom": 1}]})"),
            "faces[0]: lies outside the picture");
  EXPECT_EQ(refusal("[[]]"), "[0]: is no object with a list of \"faces\"");
  EXPECT_EQ(refusal(R"([{"file": "a", "faces": [{}]}])"), "[0].faces[0]: has no 'left'");
  EXPECT_EQ(refusal(R"([{"faces": []}])"), "[0]: does not say which \"file\" it is about");
  EXPECT_EQ(refusal(R"([{"file": "a", "faces": []}, {"file": "./a", "faces": []}])"),
            "[1]: is about a file that an entry before it is about");
}

TEST(FaceFile, ThatIsDeepIsRefusedLikeAnother) {
  EXPECT_EQ(refusal(std::string(40'000, '[') + std::string(40'000, ']')),
            "[0]: is no object with a list of \"faces\"");
}

TEST(FaceFile, ThatCannotBeReadIsNamedWithWhatElseThereIs) {
  try {
    readFaceFile("exif");
    FAIL();
  } catch (const UsageError& error) {
    EXPECT_THAT(error.what(),
                testing::StartsWith("--faces: 'exif' is neither xmp nor none nor a file that can"));
  }
}

}  // namespace
}  // namespace pelorin::cli
