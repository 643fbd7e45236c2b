#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/inotify.h>
#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>
#include <future>

#include "photo/file_io.h"
#include "photo/jpeg/jpeg_codec.h"
#include "tests/jni/support/natives_fixture.h"
#include "tests/jni/support/picture_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::StartsWith;

class JpegFileNative : public NativesTest {
 protected:
  JpegFileNative() { writePicture(input.text, picture); }

  /// What the file at `path` should be after `filter` on `source`, a file's bytes.
  static std::vector<std::uint8_t> expected(const std::vector<std::uint8_t>& source, int scale,
                                            const std::string& filter, const std::string& params) {
    const photo::DecodedPicture decoded = photo::decodeJpeg(source, scale);
    Image<RGBA8Pixel> photo(decoded.width, decoded.height);
    std::copy_n(decoded.pixels.get(), photo.byteSize(), &photo.data.get()->r);
    const std::vector<std::uint8_t> pixels = engineResult(photo, filter, params);
    return photo::encodeJpeg(pixels.data(), photo.width, photo.height, 90);
  }

  TemporaryFolder folder;
  FakeString input{folder / "in.jpg"}, output{folder / "out.jpg"};
  FakeString ae{"AE0"}, passThrough{"PassThrough"}, slider{"slider=0.4;"}, empty{""};
  FakeFaces noFaces{};
  const Image<RGBA8Pixel> picture = photoLikePicture(48, 32, 2);
};

TEST_F(JpegFileNative, WritesTheFilteredPictureAtQualityNinety) {
  EXPECT_TRUE(natives.applyToFile(input, output, 0, noFaces, 1, ae, slider));
  EXPECT_EQ(contentOf(output.text), expected(contentOf(input.text), 1, "AE0", "slider=0.4;"));
  EXPECT_THAT(takeLogLines(), ElementsAre("3 QuenbyLib: applyToJpegFile: " + input.text +
                                          " [48x32:0] AE0 slider=0.4;"));
  EXPECT_THAT(folder.content(), ElementsAre("in.jpg", "out.jpg"));
}

TEST_F(JpegFileNative, NeverOpensTheInputForWritingWithoutRotation) {
  const int watch = inotify_init1(IN_NONBLOCK | IN_CLOEXEC);
  ASSERT_GE(inotify_add_watch(watch, input.text.c_str(), IN_CLOSE_WRITE | IN_ATTRIB), 0);
  const auto wasOpenedForWriting = [&] {
    alignas(inotify_event) char events[4096];
    return read(watch, events, sizeof(events)) > 0;
  };
  EXPECT_TRUE(natives.applyToFile(input, output, 0, noFaces, 1, passThrough, empty));
  EXPECT_FALSE(wasOpenedForWriting());
  EXPECT_TRUE(natives.applyToFile(input, input, 0, noFaces, 1, passThrough, empty));
  EXPECT_TRUE(wasOpenedForWriting()) << "or replaced: the watch sees nothing";
  close(watch);
}

TEST_F(JpegFileNative, MayWriteOverItsInput) {
  for (const int rotation : {0, 90}) {
    const std::vector<std::uint8_t> before = contentOf(input.text);
    const std::vector<std::uint8_t> turned = photo::rotateJpeg(before, rotation);
    EXPECT_TRUE(natives.applyToFile(input, input, rotation, noFaces, 1, ae, slider));
    EXPECT_EQ(contentOf(input.text), expected(turned, 1, "AE0", "slider=0.4;"));
  }
}

TEST_F(JpegFileNative, TurnsFirstAndFiltersTheTurnedPicture) {
  for (const int rotation : {90, 180, 270, 360, -90}) {
    EXPECT_TRUE(natives.applyToFile(input, output, rotation, noFaces, 1, passThrough, empty));
    const std::vector<std::uint8_t> turned = photo::rotateJpeg(contentOf(input.text), rotation);
    EXPECT_EQ(contentOf(output.text), expected(turned, 1, "PassThrough", "")) << rotation;
  }
  EXPECT_THAT(takeLogLines()[0], HasSubstr(output.text + " [32x48:90] PassThrough"));
}

TEST_F(JpegFileNative, ScalesFacesByTheDecodedSize) {
  FakeFaces faces{{0.25f, 0.5f, 0.75f, 1}};
  EXPECT_TRUE(natives.applyToFile(input, output, 90, faces, 2, passThrough, empty));
  EXPECT_THAT(takeLogLines(),
              ElementsAre(HasSubstr("[16x24:90]"), "3 QuenbyLib: face bb: [4 12 24 12]"));
}

TEST_F(JpegFileNative, IsFalseWithALineForAMissingInput) {
  FakeString missing(folder / "missing.jpg");
  const std::string line = "6 QuenbyLib: image decoding/scaling failed for " + missing.text;
  EXPECT_FALSE(natives.applyToFile(missing, output, 0, noFaces, 1, ae, slider));
  EXPECT_THAT(takeLogLines(), testing::Contains(line));
  EXPECT_FALSE(natives.applyToFile(missing, output, 90, noFaces, 1, ae, slider));
  EXPECT_THAT(env.takeException(), StartsWith("java/io/IOException"));
  EXPECT_THAT(takeLogLines(), testing::Contains(line));
  EXPECT_THAT(folder.content(), ElementsAre("in.jpg"));
}

TEST_F(JpegFileNative, IsFalseForADamagedFileAndKeepsTheOldOutput) {
  std::vector<std::uint8_t> damaged = contentOf(input.text);
  const std::vector<std::uint8_t> old = {1, 2, 3};
  photo::writeFileAtomically(output.text, old);
  for (const std::size_t size :
       {damaged.size() - 1, damaged.size() / 2, std::size_t{9}, std::size_t{0}}) {
    photo::writeFileAtomically(input.text, std::span(damaged).first(size));
    EXPECT_FALSE(natives.applyToFile(input, output, 0, noFaces, 1, ae, slider)) << size;
    EXPECT_THAT(takeLogLines(),
                testing::Contains("6 QuenbyLib: image decoding/scaling failed for " + input.text));
    EXPECT_FALSE(natives.applyToFile(input, output, 90, noFaces, 1, ae, slider)) << size;
    EXPECT_THAT(env.takeException(), StartsWith("java/lang/RuntimeException: ")) << size;
    EXPECT_EQ(contentOf(output.text), old);
  }
}

TEST_F(JpegFileNative, RaisesForAnAngleThatIsNoQuarterTurn) {
  EXPECT_FALSE(natives.applyToFile(input, output, 45, noFaces, 1, ae, slider));
  EXPECT_THAT(env.takeException(), StartsWith("java/lang/RuntimeException: "));
  EXPECT_THAT(folder.content(), ElementsAre("in.jpg"));
}

TEST_F(JpegFileNative, RaisesAnIOExceptionForAnOutputThatCannotBeWritten) {
  FakeString nowhere(folder / "no such folder/out.jpg");
  for (const int rotation : {0, 90}) {
    EXPECT_FALSE(natives.applyToFile(input, nowhere, rotation, noFaces, 1, ae, slider));
    EXPECT_THAT(env.takeException(), StartsWith("java/io/IOException: "));
  }
  EXPECT_THAT(folder.content(), ElementsAre("in.jpg"));
}

TEST_F(JpegFileNative, LeavesTheRotatedCopyWhenAFilterFails) {
  EXPECT_FALSE(natives.applyToFile(input, output, 90, noFaces, 1, ae, empty));
  EXPECT_EQ(env.takeException(), "java/lang/IllegalArgumentException: map::at");
  EXPECT_EQ(contentOf(output.text), photo::rotateJpeg(contentOf(input.text), 90));
}

TEST_F(JpegFileNative, RaisesIllegalArgumentForANullPath) {
  EXPECT_FALSE(natives.applyToFile(nullptr, output, 0, noFaces, 1, ae, slider));
  EXPECT_EQ(env.takeException(), "java/lang/IllegalArgumentException: inputPath is null");
  EXPECT_FALSE(natives.applyToFile(input, nullptr, 90, noFaces, 1, ae, slider));
  EXPECT_EQ(env.takeException(), "java/lang/IllegalArgumentException: outputPath is null");
  EXPECT_THAT(takeLogLines(), IsEmpty());
}

TEST_F(JpegFileNative, TurnsInMemoryWhereTheOutputGivesNothingBack) {
  ASSERT_EQ(mkfifo(output.text.c_str(), 0600), 0);
  std::filesystem::create_symlink("out.jpg", folder / "link.jpg");
  const std::vector<std::uint8_t> turned = photo::rotateJpeg(contentOf(input.text), 90);
  alarm(60);  // a hang ends the test
  for (const std::string& name : {output.text, folder / "link.jpg"}) {
    FakeString path(name);
    auto reader = std::async(std::launch::async, [&] { return contentOf(path.text); });
    EXPECT_TRUE(natives.applyToFile(input, path, 90, noFaces, 1, ae, slider));
    EXPECT_EQ(reader.get(), expected(turned, 1, "AE0", "slider=0.4;"));
    EXPECT_THAT(takeLogLines(), ElementsAre("3 QuenbyLib: applyToJpegFile: " + path.text +
                                            " [32x48:90] AE0 slider=0.4;"));
  }
  FakeString nowhere("/dev/null");
  EXPECT_TRUE(natives.applyToFile(input, nowhere, 90, noFaces, 1, ae, slider));
  EXPECT_TRUE(std::filesystem::is_character_file("/dev/null"));
  EXPECT_FALSE(natives.applyToFile(input, nowhere, 90, noFaces, 1, ae, empty));
  EXPECT_EQ(env.takeException(), "java/lang/IllegalArgumentException: map::at");
  EXPECT_FALSE(natives.applyToFile(input, nowhere, 45, noFaces, 1, ae, slider));
  EXPECT_THAT(env.takeException(), StartsWith("java/lang/RuntimeException: "));
  alarm(0);
  EXPECT_THAT(folder.content(), ElementsAre("in.jpg", "link.jpg", "out.jpg"));
}

TEST_F(JpegFileNative, SaysThatAFolderIsNoOutput) {
  FakeString itself(folder / "");
  for (const int rotation : {0, 90}) {
    EXPECT_FALSE(natives.applyToFile(input, itself, rotation, noFaces, 1, ae, slider));
    EXPECT_THAT(env.takeException(), StartsWith("java/io/IOException: " + itself.text));
  }
}

TEST_F(JpegFileNative, BlamesTheInputOnlyForWhatIsWrongWithIt) {
  FakeString nowhere(folder / "no such folder/out.jpg");
  EXPECT_FALSE(natives.applyToFile(input, nowhere, 90, noFaces, 1, ae, slider));
  EXPECT_THAT(env.takeException(), StartsWith("java/io/IOException: "));
  EXPECT_THAT(takeLogLines(), IsEmpty());
}

TEST_F(JpegFileNative, CopiesThePictureForAnUnknownOrNullFilter) {
  FakeString unknown("NoSuchFilter");
  for (const jstring filter : {static_cast<jstring>(unknown), static_cast<jstring>(nullptr)}) {
    EXPECT_TRUE(natives.applyToFile(input, output, 0, nullptr, 1, filter, nullptr));
    EXPECT_EQ(contentOf(output.text), expected(contentOf(input.text), 1, "PassThrough", ""));
  }
}

TEST_F(JpegFileNative, OpensFilesWhoseNamesAreBeyondTheBasicPlane) {
  const std::string camera = "\xF0\x9F\x93\xB7";
  writePicture(folder / camera, picture);
  FakeString javaName(folder / "\xED\xA0\xBD\xED\xB3\xB7");  // as the virtual machine spells it
  EXPECT_TRUE(natives.applyToFile(javaName, output, 0, noFaces, 1, passThrough, empty));
}

}  // namespace
}  // namespace pelorin::test_support
