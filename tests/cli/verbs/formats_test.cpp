// Formats of photos, as a user of the built command meets them.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>

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
  EXPECT_EQ(quenby({"enhance", folder / "a.jpg", "-o", folder / "b.PNG", "--again"}).exitCode, 0);
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

// Every verb that writes a picture of its own, and how it is told where to.
const std::vector<std::vector<std::string>> drawingVerbs = {
    {"sheet", "--sliders", "0.4", "-o"},
    {"curve", "-o"},
    {"score", "--map"},
    {"keypoints", "--draw"},
};

Finished draw(const std::vector<std::string>& verb, const std::string& input,
              const std::string& output) {
  std::vector<std::string> arguments = verb;
  arguments.insert(arguments.end(), {output, input});
  return quenby(arguments);
}

TEST(Formats, OfPicturesThatVerbsDrawAreWhatTheirNamesSay) {
  const TemporaryFolder folder;
  const std::string input = folder.write("a.png", photo::save(noisePicture(97, 96, 1), "PNG"));
  for (const auto& verb : drawingVerbs) {
    for (const auto& [name, format] :
         {std::pair{verb[0] + ".png", "PNG"}, {verb[0] + ".JPEG", "JPEG"}}) {
      const Finished run = draw(verb, input, folder / name);
      ASSERT_EQ(run.exitCode, 0) << run.errors;
      EXPECT_EQ(photo::readFacts(folder.read(name)).format, format);
    }
    for (const char* name : {"b.gif", "b.rgba"}) {
      const auto before = folder.content();
      const Finished run = draw(verb, folder / "missing.jpg", folder / name);
      EXPECT_EQ(run.exitCode, 2) << verb[0] << " " << name;
      EXPECT_THAT(run.errors, HasSubstr("name it " + photo::pictureExtensions()));
      EXPECT_EQ(folder.content(), before);
    }
  }
  const Finished maps = quenby({"score", input, "--map", folder.path(), "--name", "{stem}.webp"});
  EXPECT_EQ(maps.exitCode, 2);
}

TEST(Formats, WithoutANameOfTheirOwnAreTheUsualOnes) {
  const TemporaryFolder folder;
  const std::string input = folder.write("a.png", photo::save(noisePicture(97, 96, 1), "PNG"));
  for (const auto& verb : drawingVerbs) {
    ASSERT_EQ(draw(verb, input, folder / verb[0]).exitCode, 0);
    EXPECT_EQ(photo::readFacts(folder.read(verb[0])).format, verb[0] == "sheet" ? "JPEG" : "PNG");
  }
}

TEST(Formats, StandInTheHelpOfEveryVerb) {
  for (const char* verb : {"enhance", "look", "sheet", "info", "score", "dupes", "curve", "masks",
                           "keypoints", "compare"}) {
    std::string help = quenby({verb, "--help"}).output;
    help.erase(std::unique(help.begin(), help.end(),
                           [](char a, char b) { return std::isspace(a) && std::isspace(b); }),
               help.end());
    std::replace(help.begin(), help.end(), '\n', ' ');
    EXPECT_THAT(help, HasSubstr(photo::pictureFormats() + " file")) << verb;
  }
  for (const auto& verb : drawingVerbs) {
    EXPECT_THAT(quenby({verb[0], "--help"}).output, HasSubstr(photo::pictureExtensions()))
        << verb[0];
  }
  EXPECT_THAT(quenby({"enhance", "--help"}).output, HasSubstr(photo::lossyFormats() + " quality"));
}

// The smallest of its kind: one grey pixel of 16 bits.
const Bytes deepPng = {137, 80,  78,  71,  13, 10, 26, 10, 0,   0,  0,  13,  73,  72,
                       68,  82,  0,   0,   0,  1,  0,  0,  0,   1,  16, 0,   0,   0,
                       0,   106, 238, 71,  22, 0,  0,  0,  11,  73, 68, 65,  84,  120,
                       218, 99,  96,  252, 15, 0,  1,  4,  1,   1,  86, 223, 163, 184,
                       0,   0,   0,   0,   73, 69, 78, 68, 174, 66, 96, 130};

TEST(Formats, OfSixteenBitsAreSaidOnceARun) {
  const TemporaryFolder folder;
  for (const char* name : {"a.png", "b.png", "c.png"}) folder.write(name, deepPng);
  for (const char* jobs : {"1", "3"}) {
    const TemporaryFolder made;
    const Finished run =
        quenby({"enhance", "-r", folder.path(), "-o", made.path(), "-j", jobs, "--jsonl"});
    ASSERT_EQ(run.exitCode, 0) << run.errors;
    const std::string notice = "has 16 bits a channel, read as 8";
    const std::size_t first = run.errors.find(notice);
    ASSERT_NE(first, std::string::npos) << run.errors;
    EXPECT_EQ(run.errors.find(notice, first + 1), std::string::npos) << run.errors;
    // For a program every file says it.
    for (std::size_t i = 0, at = 0; i < 3; ++i) {
      at = run.output.find(notice, at + 1);
      EXPECT_NE(at, std::string::npos) << run.output;
    }
    // 0x01FF of 65535 is nearer to 2 than to 1.
    EXPECT_EQ(photo::open(deepPng).image->row(0)->r, 2);
  }
  EXPECT_THAT(quenby({"info", folder / "a.png"}).errors, HasSubstr("has 16 bits a channel"));
  EXPECT_EQ(quenby({"info", "-q", folder / "a.png"}).errors, "");
  EXPECT_THAT(quenby({"dupes", folder / "a.png"}).errors, HasSubstr("has 16 bits a channel"));
}

}  // namespace
}  // namespace pelorin::test_support
