#include <gmock/gmock.h>
#include <sys/stat.h>

#include <sstream>

#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"

namespace pelorin::test_support {
namespace {

namespace fs = std::filesystem;

std::vector<std::string> linesOf(const std::string& text) {
  std::vector<std::string> lines;
  std::istringstream stream(text);
  for (std::string line; std::getline(stream, line);) lines.push_back(line);
  return lines;
}

std::vector<std::string> verbs() {
  std::vector<std::string> names;
  bool listed = false;
  for (const std::string& line : linesOf(quenby({"--help"}).output)) {
    if (line == "Verbs:") listed = true;
    if (!listed || !line.starts_with("  ") || line[2] == ' ') continue;
    if (line.starts_with("  quenby")) break;
    names.push_back(line.substr(2, line.find(' ', 2) - 2));
  }
  return names;
}

// What examples speak of. Every line has a folder of its own, so that none needs another.
class Examples : public testing::Test {
 protected:
  void SetUp() override {
    const auto photo = [&](const std::string& name, std::uint64_t seed) {
      folder_.write("all/" + name, jpegOf(photoLikePicture(120, 100, seed)));
    };
    std::uint64_t seed = 0;
    for (const char* name : {"photo.jpg", "a.jpg", "b.jpg", "first.jpg", "second.jpg",
                             "holiday/beach.jpg", "holiday/sea.jpg", "incoming/latest.jpg",
                             "import/new.jpg", "library/old.jpg", "archive/1999.jpg"}) {
      photo(name, ++seed);
    }
    for (const char* name : {"photos/x.jpg", "photos/y.jpg"}) photo(name, ++seed / 2 * 2);
    const Bytes pixels(std::size_t{640} * 480 * 4, 77);
    for (const char* name : {"in.rgba", "pixels.rgba", "a.rgba", "b.rgba"}) {
      folder_.write("all/" + std::string(name), pixels);
    }
    fs::create_directory(folder_ / "bin");
    fs::create_symlink(quenbyPath(), folder_ / "bin/quenby");
  }

  // What an earlier command left behind.
  std::string before(const std::string& line) const {
    if (line.find("undo before") != std::string::npos) {
      return "quenby enhance -q -r archive --in-place --backup before && ";
    }
    if (line.find("undo doubles") != std::string::npos) {
      return "cp -p photos/x.jpg photos/z.jpg && quenby dupes -q -r photos --assume-mtime "
             "--move-to "
             "doubles --apply >/dev/null && ";
    }
    if (line.find("--plan duplicates.json") != std::string::npos) {
      return "entry() { printf '{\"file\": \"%s\", \"bytes\": %s, \"modified\": \"%s\"}' "
             "\"$PWD/$1\" $(stat -c %s $1) $(date -r $1 +%s%N); }; echo '{\"schema\": 1, \"plan\": "
             "\"dupes\", \"groups\": [{\"keep\": ['$(entry a.jpg)'], \"remove\": ['$(entry "
             "b.jpg)']}]}' > duplicates.json && ";
    }
    return "";
  }

  // What would go on for ever ends.
  static std::string ending(std::string line) {
    const std::string verb = "quenby watch ";
    const std::size_t at = line.find(verb);
    if (at != std::string::npos && line.find("--once") == std::string::npos) {
      line.insert(at + verb.size(), "--once ");
    }
    if (at != std::string::npos) line.insert(at + verb.size(), "--settle 0 ");
    return line;
  }

  void expectToWork(const std::string& example) {
    const std::string line = ending(example);
    fs::copy(folder_ / "all", folder_ / "here", fs::copy_options::recursive);
    const Finished run = shell("PATH=" + folder_ / "bin" + ":$PATH; cd " + folder_ / "here" +
                               " && " + before(line) + line);
    const auto has = [&](const char* text) { return line.find(text) != std::string::npos; };
    const int other = has("--fail-above")                       ? 4
                      : has("dupes") && !has("duplicates.json") ? 3  // no photo needs to go
                                                                : 0;
    EXPECT_THAT(run.exitCode, testing::AnyOf(0, other))
        << line << "\nleaves " << run.exitCode << "\n"
        << run.errors;
    fs::remove_all(folder_ / "here");
    ++examples_;
  }

  TemporaryFolder folder_;
  int examples_ = 0;
};

TEST_F(Examples, OfTheHelpWork) {
  std::vector<std::string> helps = {quenby({"--help"}).output};
  for (const std::string& verb : verbs()) helps.push_back(quenby({verb, "--help"}).output);
  for (const std::string& help : helps) {
    bool begun = false;
    const int before = examples_;
    for (const std::string& line : linesOf(help)) {
      if (line == "Examples:") begun = true;
      if (begun && line.empty()) break;
      if (begun && line.starts_with("  ")) expectToWork(line);
    }
    EXPECT_GT(examples_, before) << help;
  }
}

// The launcher's own words need more than a folder of photos.
TEST_F(Examples, OfTheDocumentationWork) {
  const std::vector<std::string> known = verbs();
  std::vector<fs::path> pages = {fs::path(SOURCE_FOLDER) / "README.md"};
  for (const auto& entry : fs::directory_iterator(fs::path(SOURCE_FOLDER) / "docs")) {
    if (entry.path().extension() == ".md") pages.push_back(entry.path());
  }
  for (const fs::path& page : pages) {
    std::ifstream stream(page);
    bool isShell = false;
    for (std::string line; std::getline(stream, line);) {
      if (line.starts_with("```")) isShell = line == "```sh";
      const std::string start = line.starts_with("./quenby ") ? "./quenby " : "quenby ";
      if (!isShell || !line.starts_with(start)) continue;
      const std::string verb =
          line.substr(start.size(), line.find(' ', start.size()) - start.size());
      if (testing::Value(known, testing::Contains(verb))) {
        expectToWork("quenby " + line.substr(start.size()));
      } else {
        EXPECT_THAT("demo test bench jar aar wheel setup packages",
                    testing::HasSubstr(verb.substr(0, verb.find('\n'))))
            << page << ": " << line;
      }
    }
  }
  EXPECT_GT(examples_, 20);
}

}  // namespace
}  // namespace pelorin::test_support
