#include <gmock/gmock.h>

#include <sstream>

#include "tests/cli/quenby_process.h"

namespace pelorin::test_support {
namespace {

using testing::HasSubstr;
using testing::IsEmpty;

class Pages : public testing::Test {
 protected:
  Pages() { EXPECT_EQ(quenby({"pages", folder_.path()}).exitCode, 0); }

  static bool isThere(const std::string& tool) { return shell("command -v " + tool).exitCode == 0; }

  TemporaryFolder folder_;
};

TEST_F(Pages, AreManPagesThatTheFormatterTakes) {
  if (!isThere("groff")) GTEST_SKIP() << "there is no groff here";
  const Finished run = shell("for page in " + folder_ / "man/*" +
                             "; do groff -man -Kutf8 -Tutf8 -P-cbou -ww $page; done");
  EXPECT_EQ(run.exitCode, 0);
  EXPECT_THAT(run.errors, IsEmpty());
  EXPECT_THAT(run.output, HasSubstr("quenby-enhance - Make photos better"));
  EXPECT_THAT(run.output, HasSubstr("-o, --output FILE|DIR"));
  EXPECT_THAT(run.output, HasSubstr("--name '{stem}_{slider}.jpg'"));
}

TEST_F(Pages, AreOneOfEachVerb) {
  std::istringstream help(quenby({"--help"}).output);
  std::vector<std::string> pages = {"quenby.1"};
  std::string line;
  while (std::getline(help, line) && line != "Verbs:") continue;
  while (std::getline(help, line) && line.starts_with("  ")) {
    if (line[2] == ' ') continue;  // more about the verb above
    pages.push_back("quenby-" + line.substr(2, line.find(' ', 2) - 2) + ".1");
  }
  std::vector<std::string> made;
  for (const auto& page : std::filesystem::directory_iterator(folder_ / "man")) {
    made.push_back(page.path().filename());
  }
  EXPECT_THAT(made, testing::UnorderedElementsAreArray(pages));
  EXPECT_THAT(pages, testing::Contains("quenby-undo.1"));
  EXPECT_THAT(pages, testing::Not(testing::Contains("quenby-pages.1")));
}

TEST_F(Pages, TeachBash) {
  const auto offered = [&](const std::string& words) {
    const Finished run = shell("bash -c 'source " + folder_ / "bash/quenby" + "; COMP_WORDS=(" +
                               words + "); COMP_CWORD=$((${#COMP_WORDS[@]} - 1)); cd " +
                               folder_.path() + "; _quenby; echo \"${COMPREPLY[@]}\"'");
    EXPECT_THAT(run.errors, IsEmpty());
    return run.output;
  };
  EXPECT_EQ(offered("quenby dup"), "dupes\n");
  EXPECT_EQ(offered("quenby --ver"), "--version\n");
  EXPECT_EQ(offered("quenby look Win"), "WinterRGB\n");
  EXPECT_EQ(offered("quenby dupes --unk"), "--unknown-times\n");
  EXPECT_EQ(offered("quenby enhance --gain-map = d"), "drop\n");
  EXPECT_EQ(offered("quenby enhance -o ba"), "bash\n");
  EXPECT_EQ(offered("quenby enhance --slider 0"), "\n");
}

TEST_F(Pages, TeachZsh) {
  if (!isThere("zsh")) GTEST_SKIP() << "there is no zsh here";
  // A shell of its own, whose key shows what the line has become.
  folder_.write("press", std::string(R"zsh(zmodload zsh/zpty
zpty shell zsh -f -i
zpty -w shell "PROMPT=''; stty -echo; fpath=($1 \$fpath); autoload -Uz compinit; compinit -D -u
show() { zle complete-word; print -r -- \"<\$BUFFER>\"; BUFFER=''; }
zle -N show; bindkey '^I' show; print REA''DY"
zpty -r -m shell seen "*READY*"
shift
for line in $@; do
  zpty -w -n shell $line$'\t'
  zpty -r -m shell seen "*<*>*"
  print -r -- "${${seen##*<}%%>*}"
done
)zsh"));
  const Finished run = shell("timeout 60 zsh -f " + folder_ / "press" + " " + folder_ / "zsh" +
                             " 'quenby dup' 'quenby --ver' 'quenby look Win' 'quenby dupes --unk'" +
                             " 'quenby enhance --gain-map d' 'quenby enhance --faces no'");
  EXPECT_EQ(run.output,
            "quenby dupes \nquenby --version \nquenby look WinterRGB \n"
            "quenby dupes --unknown-times \nquenby enhance --gain-map drop \n"
            "quenby enhance --faces none \n")
      << run.errors;
}

TEST_F(Pages, TeachFish) {
  if (!isThere("fish")) GTEST_SKIP() << "there is no fish here";
  const Finished run = shell("HOME=" + folder_.path() + " fish --no-config -c 'source " +
                             folder_ / "fish/quenby.fish" +
                             "; for line in \"quenby dup\" \"quenby look Win\" \"quenby dupes "
                             "--unk\" \"quenby enhance --gain-map d\"; complete -C $line; end'" +
                             " | cut -f1");
  EXPECT_EQ(run.output, "dupes\nWinterRGB\n--unknown-times\ndrop\n") << run.errors;
}

}  // namespace
}  // namespace pelorin::test_support
