#include <gmock/gmock.h>

#include <algorithm>

#include "cli/frame/shown_text.h"
#include "tests/cli/parsed_json.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"

namespace pelorin::test_support {
namespace {

using testing::HasSubstr;

// A title for a terminal, a line of its own, a byte that is no UTF-8.
const std::string hostile = "a\x1b]0;owned\x07\r\nquenby: all is well \xE9 <b>.jpg";

void expectHarmless(const std::string& printed) {
  EXPECT_THAT(printed, HasSubstr("\\x1b]0;owned\\x07\\r\\nquenby: all is well \\xe9"));
  EXPECT_EQ(std::count(printed.begin(), printed.end(), '\x1b'), 0) << printed;
  EXPECT_TRUE(cli::isUtf8(printed));
}

TEST(HostileNames, ReachNoTerminalAsTheyAre) {
  const TemporaryFolder folder;
  const std::string photo = folder.write(hostile, smallJpeg());
  const std::string bad = folder.write("bad" + hostile, std::string("x"));
  expectHarmless(quenby({"info", photo}).output);
  expectHarmless(quenby({"info", bad}).errors);
  expectHarmless(quenby({"keypoints", photo, "--count", "3"}).output +
                 quenby({"score", photo}).output);
  expectHarmless(quenby({"enhance", photo, "--name", "{stem}_x.jpg", "-n"}).output);
  expectHarmless(quenby({"enhance", photo, "-o", folder / "no\x1b/x.jpg"}).errors +
                 quenby({"curve", photo, "-o", folder / "c.png", "-n"}).output);
  expectHarmless(
      quenby({"dupes", photo, folder.write("b.jpg", smallJpeg()), "--unknown-times"}).output);
  const std::string page =
      quenby({"dupes", photo, folder / "b.jpg", bad, "--unknown-times", "--html", "-"}).output;
  expectHarmless(page);
  EXPECT_THAT(page, HasSubstr("&lt;b&gt;"));
}

TEST(HostileNames, AreWholeInJson) {
  const TemporaryFolder folder;
  const std::string photo = folder.write("\xE9.jpg", smallJpeg());
  const nlohmann::json info = parsedJson(quenby({"info", photo, "--json"}).output);
  EXPECT_THAT(info["file"].get<std::string>(), HasSubstr("\xEF\xBF\xBD.jpg"));
  const Finished decoded =
      shell("printf %s '" + info["fileBase64"].get<std::string>() + "' | base64 -d");
  EXPECT_EQ(decoded.output, photo);
  const nlohmann::json plain =
      parsedJson(quenby({"info", folder.write("e.jpg", smallJpeg()), "--json"}).output);
  EXPECT_FALSE(plain.contains("fileBase64"));
}

TEST(HostileNames, AreNoFormulasInTables) {
  const TemporaryFolder folder;
  for (const char* name : {"=1+1.jpg", "+1.jpg", "-1.jpg"}) {
    folder.write(name, smallJpeg());
    const Finished run = shell("cd " + folder.path() + " && $QUENBY score --csv -- '" + name + "'");
    EXPECT_THAT(run.output, HasSubstr("\n./" + std::string(name) + ",")) << run.errors;
  }
}

}  // namespace
}  // namespace pelorin::test_support
