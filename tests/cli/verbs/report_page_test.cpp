#include <gmock/gmock.h>

#include <filesystem>

#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"

namespace pelorin::test_support {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::Not;

namespace fs = std::filesystem;

std::size_t count(const std::string& text, const std::string& part) {
  std::size_t times = 0;
  for (std::size_t at = 0; (at = text.find(part, at)) != std::string::npos; ++at) ++times;
  return times;
}

class ReportPage : public testing::Test {
 protected:
  ReportPage() {
    folder.write("in/a.jpg", smallJpeg(1));
    folder.write("in/b.jpg", smallJpeg(2));
  }

  Finished enhance(std::vector<std::string> more) const {
    more.insert(more.begin(), {"enhance", "-r", folder / "in"});
    return quenby(more);
  }
  std::string page() const { return textOf(folder.read("page.html")); }

  TemporaryFolder folder;
  const std::string path = folder / "page.html";
};

TEST_F(ReportPage, ChangesNoResult) {
  EXPECT_EQ(enhance({"-o", folder / "plain/"}).exitCode, 0);
  const Finished run = enhance({"-o", folder / "out/", "--report", path, "-j", "2"});
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  for (const char* name : {"/a_AE0.jpg", "/b_AE0.jpg"}) {
    EXPECT_EQ(folder.read(std::string("out") + name), folder.read(std::string("plain") + name));
  }
  EXPECT_THAT(page(), HasSubstr("2 photos: AE0, slider 0.4"));
  EXPECT_EQ(count(page(), "class=\"pair\""), 2u);
  EXPECT_EQ(count(page(), "slider 0.7</figcaption>"), 2u);
  EXPECT_LT(page().find("in/a.jpg"), page().find("in/b.jpg"));
  EXPECT_THAT(page(), Not(HasSubstr("http:")));
}

// The page is the same whether its photos were done now or by a run before, but for saying so.
TEST_F(ReportPage, ShowsWhatAnEarlierRunMade) {
  folder.write("in/broken.jpg", "no photo");
  EXPECT_EQ(enhance({"-o", folder / "out/"}).exitCode, 1);
  EXPECT_EQ(enhance({"-o", folder / "out/", "--report", path}).exitCode, 1);
  EXPECT_EQ(count(page(), "was there already"), 2u);
  EXPECT_EQ(count(page(), "class=\"pair\""), 2u);
  EXPECT_THAT(page(), HasSubstr("broken.jpg</h2>"));
  // Nothing is overwritten unasked, and what stops a page stops before any work.
  fs::remove_all(folder / "out");
  const Finished again = enhance({"-o", folder / "out/", "--report", path});
  EXPECT_EQ(again.exitCode, 2);
  EXPECT_THAT(again.errors, HasSubstr("page.html exists; add --overwrite"));
  EXPECT_FALSE(folder.has("out"));
}

TEST_F(ReportPage, ShowsPhotosThatWereReplacedBesideTheirBackups) {
  const std::vector<std::string> inPlace = {"--in-place", "--backup", folder / "kept"};
  std::vector<std::string> reporting = inPlace;
  reporting.insert(reporting.end(), {"--report", path});
  EXPECT_EQ(enhance(reporting).exitCode, 0);
  const std::string first = page();
  fs::remove(path);
  EXPECT_EQ(enhance(reporting).exitCode, 0);
  std::string second = page();
  EXPECT_EQ(count(second, "was there already"), 2u);
  for (const std::string remark : {" \xC2\xB7 was there already"}) {
    for (std::size_t at; (at = second.find(remark)) != std::string::npos;)
      second.erase(at, remark.size());
  }
  EXPECT_EQ(first, second);
}

TEST_F(ReportPage, IsMadeForLooksAndForRawPixels) {
  EXPECT_EQ(
      quenby({"look", "winter", folder / "in/a.jpg", "-o", folder / "w.jpg", "--report", path})
          .exitCode,
      0);
  EXPECT_EQ(count(page(), "class=\"pair\""), 1u);
  EXPECT_EQ(count(page(), "slider 0."), 0u);
  folder.write("p.rgba", Bytes(20 * 10 * 4, 90));
  const Finished raw =
      quenby({"enhance", "--raw", "20x10", folder / "p.rgba", "-o", folder / "o.rgba", "--rotate",
              "90", "--report", path, "--overwrite"});
  EXPECT_EQ(raw.exitCode, 0) << raw.errors;
  EXPECT_THAT(page(), HasSubstr("10 \xC3\x97 20"));
}

TEST_F(ReportPage, SaysOfAnEditedPhotoThatItIs) {
  EXPECT_EQ(enhance({"-o", folder / "out/"}).exitCode, 0);
  const Finished run =
      quenby({"enhance", folder / "out/a_AE0.jpg", "-o", folder / "twice.jpg", "--report", path});
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_THAT(page(), HasSubstr("enhanced already (AE0, slider 0.4)"));
  EXPECT_EQ(count(page(), "class=\"pair one\""), 1u);
}

TEST_F(ReportPage, IsNeitherInputNorResultNorMadeInAPlan) {
  const auto refused = [&](const std::vector<std::string>& arguments) {
    const Finished run = quenby(arguments);
    EXPECT_EQ(run.exitCode, 2);
    return run.errors;
  };
  const std::string a = folder / "in/a.jpg";
  folder.write("list.html", a);
  EXPECT_THAT(refused({"enhance", "@" + folder / "list.html", "-o", folder / "out/", "--report",
                       folder / "list.html", "--overwrite"}),
              HasSubstr("is itself the list of inputs"));
  EXPECT_THAT(refused({"enhance", a, "-o", folder / "out.jpg", "--report", folder / "out.jpg"}),
              HasSubstr("the page is no .jpg file"));
  EXPECT_THAT(refused({"enhance", a, "-o", folder / "out", "--report", folder / "out"}),
              HasSubstr("is itself a result"));
  EXPECT_THAT(refused({"enhance", a, "-o", "-", "--report", "-"}), HasSubstr("--report -"));
  EXPECT_THAT(refused({"enhance", a, "--report", folder / "in"}), HasSubstr("is a folder"));

  const Finished plan = enhance({"-o", folder / "out/", "--report", path, "-n"});
  EXPECT_EQ(plan.exitCode, 0);
  EXPECT_THAT(plan.output, HasSubstr("before and after of 2 photos -> " + path));
  EXPECT_THAT(folder.content(), ElementsAre("in/", "in/a.jpg", "in/b.jpg", "list.html"));
}

}  // namespace
}  // namespace pelorin::test_support
