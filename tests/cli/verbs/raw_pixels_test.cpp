#include <gmock/gmock.h>

#include "tests/cli/filtered_directly.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using image_processing::BoundingBox;
using image_processing::ImageMetadata;
using testing::HasSubstr;

TEST(RawPixels, PipedThroughEqualTheEnginesByteForByte) {
  const Image<RGBA8Pixel> source = photoLikePicture(160, 120, 4);
  ImageMetadata faces;
  faces.faces.push_back(std::make_shared<BoundingBox>(BoundingBox{40, 120, 90, 12}));
  struct Case {
    std::vector<std::string> options;
    Bytes expected;
  };
  const std::vector<Case> cases = {
      {{}, filteredDirectly(source, "AE0", "slider=0.4;")},
      {{"--slider", "1"}, filteredDirectly(source, "AE0", "slider=1;")},
      {{"--face", "0.25,0.1,0.75,0.75"}, filteredDirectly(source, "AE0", "slider=0.4;", faces)},
      {{"--face", "40,12,120,90"}, filteredDirectly(source, "AE0", "slider=0.4;", faces)},
      {{"--filter", "AE08bit", "--face", "0.25,0.1,0.75,0.75"},
       filteredDirectly(source, "AE08bit", "slider=0.4;", faces)},
      {{"--filter", "PassThrough"}, rawBytes(source)},
  };
  for (const Case& c : cases) {
    std::vector<std::string> arguments = {"enhance", "--raw", "160x120", "-", "-o", "-"};
    arguments.insert(arguments.end(), c.options.begin(), c.options.end());
    const Finished run = quenby(arguments, rawBytes(source));
    EXPECT_EQ(run.exitCode, 0) << run.errors;
    EXPECT_TRUE(Bytes(run.output.begin(), run.output.end()) == c.expected)
        << testing::PrintToString(c.options);
  }
}

TEST(RawPixels, GoThroughFilesToo) {
  const TemporaryFolder folder;
  const Image<RGBA8Pixel> source = noisePicture(7, 5, 1);
  const std::string in = folder.write("a.rgba", rawBytes(source));
  EXPECT_EQ(quenby({"enhance", "--raw", "7x5", in, "-o", folder.path(), "--filter", "PassThrough"})
                .exitCode,
            0);
  EXPECT_EQ(folder.read("a_PassThrough.rgba"), rawBytes(source));
}

TEST(RawPixels, OfOneRowOrColumnAreFine) {
  for (const char* size : {"1x1", "300x1", "1x300"}) {
    const Bytes input(std::string(size) == "1x1" ? 4 : 1200, 77);
    const Finished run = quenby({"enhance", "--raw", size, "-", "-o", "-"}, input);
    EXPECT_EQ(run.exitCode, 0) << run.errors;
    EXPECT_EQ(run.output.size(), input.size());
  }
}

TEST(RawPixels, OfAnotherByteCountAreRefused) {
  const TemporaryFolder folder;
  for (const std::size_t count : {0u, 1u, 139u, 141u, 280u}) {
    const Bytes bytes(count, 1);
    const std::string in = folder.write("a.rgba", bytes);
    const Finished file = quenby({"enhance", "--raw", "7x5", in, "-o", folder / "b.rgba"});
    EXPECT_EQ(file.exitCode, 1);
    EXPECT_THAT(file.errors, HasSubstr(in + ": holds " + std::to_string(count) +
                                       " bytes, but 7x5 raw pixels are 140 bytes"));
    const Finished stream = quenby({"enhance", "--raw", "7x5", "-", "-o", "-"}, bytes);
    EXPECT_EQ(stream.exitCode, 1);
    EXPECT_THAT(stream.errors, HasSubstr("standard input: holds " + std::to_string(count)));
    EXPECT_EQ(stream.output, "");
  }
  EXPECT_FALSE(folder.has("b.rgba"));
}

TEST(RawPixels, OfAClaimedHugeSizeAllocateNothing) {
  for (const char* size : {"65500x65500", "4294967295x4294967295"}) {
    const Finished run = quenby({"enhance", "--raw", size, "-", "-o", "-"}, Bytes(16));
    EXPECT_EQ(run.exitCode, 1);
    EXPECT_THAT(run.errors, HasSubstr("standard input: "));
  }
}

}  // namespace
}  // namespace pelorin::test_support
