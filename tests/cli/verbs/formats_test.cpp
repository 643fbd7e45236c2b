// Formats of photos, as a user of the built command meets them.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "photo/photo.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/pictures.h"
#include "tests/support/temporary_folder.h"

namespace pelorin::test_support {
namespace {

using testing::HasSubstr;

Bytes pngOf(std::uint64_t seed) {
  photo::Metadata metadata;
  metadata.chunks = {{"tEXt", {'T', 'i', 't', 'l', 'e', 0, 'x'}}};
  return photo::save(noisePicture(40, 30, seed), "PNG", metadata);
}

TEST(Formats, PngStaysPngWithItsTexts) {
  const TemporaryFolder folder;
  folder.write("a.png", pngOf(1));
  const Finished run = quenby({"enhance", "-r", folder.path(), "--name", "{stem}_new.{ext}"});
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  const photo::Photo photo = photo::open(folder.read("a_new.png"));
  EXPECT_EQ(photo.facts.format, "PNG");
  EXPECT_EQ(photo.metadata.chunks.size(), 1u);
}

TEST(Formats, ExtensionsSayWhatIsWritten) {
  const TemporaryFolder folder;
  folder.write("a.png", pngOf(1));
  EXPECT_EQ(quenby({"enhance", folder / "a.png", "-o", folder / "a.jpg"}).exitCode, 0);
  EXPECT_EQ(photo::readFacts(folder.read("a.jpg")).format, "JPEG");
  EXPECT_EQ(quenby({"enhance", folder / "a.jpg", "-o", folder / "b.PNG"}).exitCode, 0);
  EXPECT_EQ(photo::readFacts(folder.read("b.PNG")).format, "PNG");
}

TEST(Formats, ThatDoNotFitTheNameAreRefusedBeforeAnyWork) {
  const TemporaryFolder folder;
  folder.write("a.png", pngOf(1));
  folder.write("a.rgba", Bytes(40 * 30 * 4));
  const auto before = folder.content();
  for (const std::vector<std::string>& options :
       {std::vector<std::string>{"a.png", "-o", "a.gif"},
        {"a.png", "-o", "a.tiff"},
        {"a.png", "-o", "b.rgba"},
        {"a.png", "--name", "{stem}.webp"},
        {"a.rgba", "--raw", "40x30", "-o", "b.png"},
        {"a.rgba", "--raw", "40x30", "-o", "b.jpg"},
        {"a.rgba", "--raw", "40x30", "--name", "{stem}.jpeg"}}) {
    std::vector<std::string> arguments = {"enhance", folder / options[0]};
    for (std::size_t i = 1; i < options.size(); ++i)
      arguments.push_back(options[i - 1] == "-o" ? folder / options[i] : options[i]);
    const Finished run = quenby(arguments);
    EXPECT_EQ(run.exitCode, 2) << options.back();
    EXPECT_THAT(run.errors, HasSubstr("name it ."));
    EXPECT_EQ(folder.content(), before);
  }
}

TEST(Formats, ThatCannotBeReadAreNamed) {
  const TemporaryFolder folder;
  folder.write("a.jpg", std::string("\0\0\0\x18"
                                    "ftypheic\0\0\0\0mif1heic",
                                    24));
  const Finished run = quenby({"enhance", folder / "a.jpg", "-o", folder / "b.jpg"});
  EXPECT_EQ(run.exitCode, 1);
  EXPECT_THAT(run.errors, HasSubstr("a HEIC photo; convert it first, for example with: "));
}

TEST(Formats, StandInTheHelp) {
  const Finished run = quenby({"enhance", "--help"});
  EXPECT_THAT(run.output, HasSubstr("JPEG or PNG files"));
  EXPECT_THAT(run.output, HasSubstr(".png"));
}

}  // namespace
}  // namespace pelorin::test_support
