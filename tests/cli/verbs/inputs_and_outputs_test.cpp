#include <gmock/gmock.h>
#include <sys/stat.h>

#include "tests/cli/parsed_json.h"
#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"

namespace pelorin::test_support {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;

// Fast, and as good as any filter where only names matter.
Finished enhance(std::vector<std::string> arguments, const Bytes& input = {}) {
  arguments.insert(arguments.begin(), {"enhance", "--filter", "PassThrough"});
  return quenby(arguments, input);
}

TEST(Folders, AreTakenRecursivelyInSortedOrderWithPhotosOnly) {
  const TemporaryFolder folder;
  for (const char* name :
       {"in/b.jpg", "in/a.JPEG", "in/sub/c.jpe", "in/z.Jpg", "in/deep/er/d.jpg"}) {
    folder.write(name, smallJpeg());
  }
  folder.write("in/notes.txt", std::string("x"));
  folder.write("in/raw.gif", std::string("x"));
  folder.makeFolder("in/folder.jpg");
  const Finished plan = enhance({"-r", folder / "in", "--name", "{stem}_x.jpg", "-n"});
  EXPECT_EQ(plan.exitCode, 0);
  const std::string in = folder / "in/";
  EXPECT_EQ(plan.output, in + "a.JPEG -> " + in + "a_x.jpg\n" +     //
                             in + "b.jpg -> " + in + "b_x.jpg\n" +  //
                             in + "deep/er/d.jpg -> " + in + "deep/er/d_x.jpg\n" + in +
                             "sub/c.jpe -> " + in + "sub/c_x.jpg\n" + in + "z.Jpg -> " + in +
                             "z_x.jpg\n");
}

TEST(Folders, KeepTheirSubFoldersInTheOutput) {
  const TemporaryFolder folder;
  folder.write("in/a.jpg", smallJpeg());
  folder.write("in/sub/a.jpg", smallJpeg());
  folder.write("in/bad/a.jpg", std::string("x"));
  const Finished run = enhance({"-r", folder / "in", "-o", folder.makeFolder("out")});
  EXPECT_EQ(run.exitCode, 1);
  EXPECT_THAT(folder.content(), ElementsAre("in/", "in/a.jpg", "in/bad/", "in/bad/a.jpg", "in/sub/",
                                            "in/sub/a.jpg", "out/", "out/a_PassThrough.jpg",
                                            "out/sub/", "out/sub/a_PassThrough.jpg"));
}

TEST(Folders, NeedTheRecursiveOption) {
  const TemporaryFolder folder;
  const Finished run = enhance({folder.path(), "-o", folder / "b.jpg"});
  EXPECT_EQ(run.exitCode, 2);
  EXPECT_THAT(run.errors, HasSubstr(folder.path() + ": is a folder; add -r"));
}

TEST(Folders, WithoutPhotosAreNothingToDo) {
  const TemporaryFolder folder;
  const Finished run =
      enhance({"-r", folder.makeFolder("in"), "-o", folder.makeFolder("out"), "--json"});
  EXPECT_EQ(run.exitCode, 3);
  EXPECT_EQ(run.output, "[]\n");
}

TEST(Folders, NameWhatTheyHoldThatIsNoFileAndGoOn) {
  const TemporaryFolder folder;
  folder.write("in/a.jpg", smallJpeg());
  ASSERT_EQ(mkfifo((folder / "in/pipe.jpg").c_str(), 0600), 0);
  ASSERT_EQ(mkfifo((folder / "in/other").c_str(), 0600), 0);  // not called like a photo
  std::filesystem::create_symlink("nowhere", folder / "in/link.jpg");
  std::filesystem::create_symlink("/dev/null", folder / "in/null.png");
  std::filesystem::create_symlink(".", folder / "in/loop");
  for (const std::string verb : {"enhance", "info", "score", "sheet", "dupes"}) {
    std::vector<std::string> arguments = {verb, "-r", folder / "in"};
    if (verb == "enhance") arguments.insert(arguments.end(), {"-o", folder / "out/"});
    if (verb == "sheet") arguments.insert(arguments.end(), {"-o", folder / "sheet.png"});
    const Finished run = quenby(arguments);
    EXPECT_EQ(run.exitCode, 1) << verb;
    EXPECT_THAT(run.errors, HasSubstr("in/pipe.jpg: is a pipe, not a file")) << verb;
    EXPECT_THAT(run.errors, HasSubstr("in/link.jpg: is a link to nothing")) << verb;
    EXPECT_THAT(run.errors, HasSubstr("in/null.png: is a device, not a file")) << verb;
    EXPECT_THAT(run.errors, Not(HasSubstr("other"))) << verb;
  }
  EXPECT_TRUE(folder.has("out/a_AE0.jpg"));
}

TEST(Folders, ThatCannotBeReadAreNamed) {
  const TemporaryFolder folder;
  folder.write("in/a.jpg", smallJpeg());
  std::filesystem::permissions(folder.makeFolder("in/closed"), std::filesystem::perms::none);
  std::filesystem::permissions(folder.path(), std::filesystem::perms{0755});
  // Whoever may read everything becomes somebody else.
  const std::string command = "$QUENBY info -r " + folder / "in";
  const Finished run = shell(
      "[ $(id -u) != 0 ] || nobody='setpriv --reuid 65534 --clear-groups'; "
      "$nobody test -x $QUENBY || exit 77; $nobody " +
      command);
  std::filesystem::permissions(folder / "in/closed", std::filesystem::perms{0755});
  if (run.exitCode == 77) GTEST_SKIP() << "nobody may run the command here";
  EXPECT_EQ(run.exitCode, 1);
  EXPECT_THAT(run.output, HasSubstr("in/a.jpg"));
  EXPECT_THAT(run.errors, HasSubstr("in/closed: cannot be read: Permission denied"));
}

TEST(Folders, HideWhatSystemsPutBesidePhotos) {
  const TemporaryFolder folder;
  for (const char* name : {"a.jpg", ".b.jpg", "._a.jpg", "@eaDir/c.jpg", "x/.thumbnails/d.jpg"}) {
    folder.write(name, smallJpeg());
  }
  const std::vector<std::string> plan = {"-r", folder.path(), "-n", "-o", folder / "out/"};
  EXPECT_EQ(enhance(plan).output, folder / "a.jpg -> " + folder / "out/a_PassThrough.jpg\n");
  std::vector<std::string> all = plan;
  all.push_back("--hidden");
  const std::string shown = enhance(all).output;
  EXPECT_EQ(std::count(shown.begin(), shown.end(), '\n'), 5);
  all.insert(all.end(), {"--exclude", "@*", "--exclude", "x/*/d.jpg", "--exclude", ".?.jpg"});
  EXPECT_EQ(enhance(all).output, folder / "._a.jpg -> " + folder / "out/._a_PassThrough.jpg\n" +
                                     folder / "a.jpg -> " + folder / "out/a_PassThrough.jpg\n");
}

TEST(Lists, NameOneFileALine) {
  const TemporaryFolder folder;
  const std::string a = folder.write("a.jpg", smallJpeg());
  const std::string b = folder.write("b c.jpg", smallJpeg());
  const std::string list = folder.write("list", a + "\r\n\n" + b);
  const std::string out = folder.makeFolder("out");
  EXPECT_EQ(enhance({"@" + list, "-o", out}).exitCode, 0);
  EXPECT_TRUE(folder.has("out/a_PassThrough.jpg"));
  EXPECT_TRUE(folder.has("out/b c_PassThrough.jpg"));
}

TEST(Lists, MayComeFromStandardInput) {
  const TemporaryFolder folder;
  const std::string a = folder.write("a.jpg", smallJpeg()) + "\n";
  const std::string out = folder.makeFolder("out");
  EXPECT_EQ(enhance({"@-", "-o", out}, Bytes(a.begin(), a.end())).exitCode, 0);
  EXPECT_TRUE(folder.has("out/a_PassThrough.jpg"));
  EXPECT_EQ(enhance({"@-", "-", "-o", out}).exitCode, 2);
}

TEST(Lists, WithANulHoldAnyName) {
  const TemporaryFolder folder;
  folder.write("in/a\nb.jpg", smallJpeg());
  folder.write("in/c\r.jpg", smallJpeg());
  const std::string out = folder / "out/";
  const Finished run = shell("find " + folder / "in" + " -type f -print0" +
                             " | $QUENBY enhance --filter PassThrough @- -o " + out);
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  const Finished from = shell("cd " + folder / "in" +
                              " && find . -type f -print0 > ../list && $QUENBY info --jsonl "
                              "--files-from ../list && $QUENBY info --files-from - < ../list");
  EXPECT_EQ(from.exitCode, 0) << from.errors;
  EXPECT_THAT(from.output, HasSubstr("\"./c\\r.jpg\""));
  EXPECT_TRUE(folder.has("out/a\nb_PassThrough.jpg"));
  EXPECT_TRUE(folder.has("out/c\r_PassThrough.jpg"));
}

TEST(Lists, AreNeededWhereNothingIsNamed) {
  const Finished run = quenby({"info"});
  EXPECT_EQ(run.exitCode, 2);
  EXPECT_THAT(run.errors, HasSubstr("name the photos, or a list of them with --files-from"));
}

TEST(Lists, ThatCannotBeReadAreRefused) {
  const TemporaryFolder folder;
  const std::string at = "@";
  for (const std::string& list : {folder / "none", folder.path()}) {
    const Finished run = enhance({at + list, "-o", folder.path()});
    EXPECT_EQ(run.exitCode, 2);
    EXPECT_THAT(run.errors, HasSubstr(list + ": cannot be read as a list of files"));
  }
}

TEST(Inputs, MayBeCalledAlmostAnything) {
  const TemporaryFolder folder;
  for (const std::string name : {"[a,b]", "ü ñ.jpg", "a\nb.jpg", "{x}.jpg", "%s.jpg"}) {
    const std::string in = folder.write(name, smallJpeg());
    EXPECT_EQ(enhance({in, "-o", folder / "out.jpg", "--overwrite"}).exitCode, 0) << name;
  }
  const Finished run = shell("cd '" + folder.path() +
                             "' && \"$QUENBY\" enhance '[a,b]' -o x.jpg && \"$QUENBY\" info "
                             "'[a,b]' --jsonl && cp x.jpg ./-x.jpg && \"$QUENBY\" info ./-x.jpg");
  EXPECT_EQ(run.exitCode, 0) << run.errors;
}

TEST(Names, AreMadeFromPlaceholders) {
  const TemporaryFolder folder;
  const std::string in = folder.write("my.photo.jpg", smallJpeg());
  const Finished run = quenby({"enhance", in, "-o", folder.path(), "--slider", "0.25", "--name",
                               "{filter}-{slider}-{stem}-{stem}.jpeg"});
  EXPECT_EQ(run.exitCode, 0) << run.errors;
  EXPECT_TRUE(folder.has("AE0-0.25-my.photo-my.photo.jpeg"));
}

TEST(Names, ThatMeanNothingAreRefused) {
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", smallJpeg());
  for (const char* name : {"{stm}.jpg", "{stem", "sub/{stem}.jpg", "..", "{}"}) {
    const Finished run = enhance({in, "-o", folder.path(), "--name", name});
    EXPECT_EQ(run.exitCode, 2) << name;
    EXPECT_THAT(run.errors, HasSubstr("--name")) << name;
  }
  EXPECT_THAT(enhance({in, "-o", folder.path(), "--name", "{stm}.jpg"}).errors,
              HasSubstr("did you mean 'stem'?"));
  EXPECT_THAT(folder.content(), ElementsAre("a.jpg"));
}

TEST(Outputs, StandBesideTheirInputsAndAreNoInputsLater) {
  const TemporaryFolder folder;
  folder.write("in/a.jpg", smallJpeg());
  EXPECT_EQ(enhance({folder / "in/a.jpg"}).exitCode, 0);
  folder.write("in/b.jpg", smallJpeg());
  const std::string all = folder / "in/*.jpg";
  for (const int expected : {0, 3, 3}) {
    const Finished run =
        shell("$QUENBY enhance --filter PassThrough " + all + (expected == 0 ? "" : " -j 1"));
    EXPECT_EQ(run.exitCode, expected) << run.errors;
    EXPECT_EQ(enhance({"-r", folder / "in"}).exitCode, 3);
  }
  EXPECT_EQ(enhance({"-r", folder / "in", "--overwrite"}).exitCode, 0);
  EXPECT_THAT(folder.content(), ElementsAre("in/", "in/a.jpg", "in/a_PassThrough.jpg", "in/b.jpg",
                                            "in/b_PassThrough.jpg"));
}

TEST(Outputs, MakeTheirFolder) {
  const TemporaryFolder folder;
  const std::string a = folder.write("a.jpg", smallJpeg());
  EXPECT_EQ(enhance({a, "-o", folder / "new/er/"}).exitCode, 0);
  EXPECT_EQ(enhance({a, folder.write("b.jpg", smallJpeg()), "-o", folder / "two"}).exitCode, 0);
  EXPECT_EQ(enhance({folder / "none.jpg", "-o", folder / "for-nothing/"}).exitCode, 1);
  EXPECT_EQ(quenby({"masks", a, "-o", folder / "masks"}).exitCode, 0);
  EXPECT_THAT(folder.content(),
              ElementsAre("a.jpg", "b.jpg", "masks/", "masks/bilateral.png", "masks/ltm.png",
                          "new/", "new/er/", "new/er/a_PassThrough.jpg", "two/",
                          "two/a_PassThrough.jpg", "two/b_PassThrough.jpg"));
}

TEST(Outputs, OfSeveralInputsNeedAFolder) {
  const TemporaryFolder folder;
  const std::string a = folder.write("a.jpg", smallJpeg());
  const std::string b = folder.write("b.jpg", smallJpeg());
  EXPECT_EQ(enhance({a, b, "-o", folder / "c.jpg"}).exitCode, 2);
  EXPECT_EQ(enhance({a, b, "-o", "-"}).exitCode, 2);
  EXPECT_EQ(enhance({a, "-o", folder / "new/c.jpg"}).exitCode, 2);
  EXPECT_EQ(enhance({a, b, "-o", b}).exitCode, 2);
  EXPECT_THAT(folder.content(), ElementsAre("a.jpg", "b.jpg"));
}

TEST(Outputs, ThatAreThereAlreadyStay) {
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", smallJpeg());
  const std::string out = folder.write("b.jpg", std::string("old"));
  const Finished run = enhance({in, "-o", out});
  EXPECT_EQ(run.exitCode, 3);
  EXPECT_THAT(run.errors, HasSubstr(out + ": exists already; add --overwrite"));
  EXPECT_EQ(textOf(folder.read("b.jpg")), "old");
  EXPECT_EQ(enhance({in, "-o", out, "--overwrite"}).exitCode, 0);
  EXPECT_EQ(decoded(folder.read("b.jpg")).width, 48u);
}

TEST(Outputs, ThatAreThereAlreadyDoNotStopTheOthers) {
  const TemporaryFolder folder;
  const std::string a = folder.write("a.jpg", smallJpeg());
  const std::string b = folder.write("b.jpg", smallJpeg());
  folder.write("out/a_PassThrough.jpg", std::string("old"));
  const Finished run = enhance({a, b, "-o", folder / "out"});
  EXPECT_EQ(run.exitCode, 0);
  EXPECT_EQ(run.errors,
            "1 of 2 photos done, 0 failed, 1 there already; --overwrite replaces them\n");
  EXPECT_EQ(textOf(folder.read("out/a_PassThrough.jpg")), "old");
  EXPECT_TRUE(folder.has("out/b_PassThrough.jpg"));
}

TEST(Outputs, OfTwoInputsAreTwoFiles) {
  const TemporaryFolder folder;
  const std::string a = folder.write("x/a.jpg", smallJpeg());
  const std::string b = folder.write("y/a.jpg", smallJpeg());
  const Finished run = enhance({a, b, "-o", folder.makeFolder("out")});
  EXPECT_EQ(run.exitCode, 2);
  EXPECT_THAT(run.errors, HasSubstr("both " + a + " and " + b));
  EXPECT_TRUE(std::filesystem::is_empty(folder / "out"));
}

TEST(Outputs, MayReplaceTheirOwnInputOnlyOnRequest) {
  const TemporaryFolder folder;
  const Bytes file = smallJpeg();
  const std::string in = folder.write("a.jpg", file);
  std::filesystem::create_symlink(folder.path(), folder / "link");
  for (const std::string& out : {in, folder / "./a.jpg", folder / "link/a.jpg"}) {
    const Finished run = enhance({in, "-o", out});
    EXPECT_EQ(run.exitCode, 2);
    EXPECT_THAT(run.errors, HasSubstr("is the input itself; add --overwrite"));
  }
  EXPECT_EQ(folder.read("a.jpg"), file);
  EXPECT_EQ(enhance({in, "-o", in, "--overwrite", "--no-mark"}).exitCode, 0);
  EXPECT_EQ(folder.read("a.jpg"), jpegOf(decoded(file)));
}

TEST(Outputs, NeverReplaceAnotherInput) {
  const TemporaryFolder folder;
  const Bytes file = smallJpeg();
  const std::string a = folder.write("a.jpg", file);
  const std::string b = folder.write("a_x.jpg", file);
  const Finished run = enhance({a, b, "--name", "{stem}_x.jpg", "--overwrite"});
  EXPECT_EQ(run.exitCode, 2);
  EXPECT_THAT(run.errors, HasSubstr(b + ": is itself an input"));
  EXPECT_EQ(folder.read("a_x.jpg"), file);
}

TEST(Outputs, NeverReplaceAnInputUnderAnotherNameOfIt) {
  const TemporaryFolder folder;
  const std::string a = folder.write("real/a.png", smallJpeg());
  const std::string b = folder.write("b.jpg", smallJpeg());
  std::filesystem::create_directory_symlink("real", folder / "link");
  std::filesystem::create_symlink("real/a.png", folder / "c.png");
  for (const std::string& out :
       {folder / "link/a.png", folder / "c.png", folder / "link/../link/a.png"}) {
    const Finished run = quenby({"sheet", b, a, "-o", out, "--overwrite"});
    EXPECT_EQ(run.exitCode, 2) << out;
  }
  for (const std::vector<std::string>& verb :
       {std::vector<std::string>{"curve", a, "-o", folder / "c.png", "--overwrite"},
        {"keypoints", a, "--draw", folder / "link/a.png", "--overwrite"},
        {"score", a, b, "--map", folder.path(), "--name", "b.jpg", "--overwrite"}}) {
    EXPECT_EQ(quenby(verb).exitCode, 2) << verb[0];
  }
  EXPECT_EQ(folder.read("real/a.png"), smallJpeg());
}

TEST(Outputs, NeverReplaceTheListOfInputs) {
  const TemporaryFolder folder;
  const std::string list = folder.write("list", folder.write("a.jpg", smallJpeg()) + "\n");
  const Finished run = enhance({"@" + list, "-o", folder.path(), "--name", "list", "--overwrite"});
  EXPECT_EQ(run.exitCode, 2);
  EXPECT_THAT(run.errors, HasSubstr("is the list of inputs"));
}

TEST(Outputs, MayReplaceOneOfTwoNamesOfAFile) {
  const TemporaryFolder folder;
  const Bytes file = smallJpeg();
  const std::string a = folder.write("a.jpg", file);
  std::filesystem::create_hard_link(a, folder / "b.jpg");
  EXPECT_EQ(enhance({a, "-o", folder / "b.jpg", "--overwrite", "--no-mark"}).exitCode, 0);
  EXPECT_EQ(folder.read("a.jpg"), file);
  EXPECT_EQ(folder.read("b.jpg"), jpegOf(decoded(file)));
}

TEST(Outputs, OfKilledRunsAreSwept) {
  const TemporaryFolder folder;
  const std::string a = folder.write("a.jpg", smallJpeg());
  folder.write("out/.quenby-1-0.tmp", std::string("half"));
  folder.write("out/.quenby-mine.tmp", std::string("mine"));
  folder.write(".quenby-1-0.tmp", std::string("half"));
  EXPECT_EQ(enhance({a, "-o", folder / "out"}).exitCode, 0);
  EXPECT_EQ(quenby({"curve", a, "-o", folder / "c.png"}).exitCode, 0);
  EXPECT_THAT(folder.content(), ElementsAre("a.jpg", "c.png", "out/", "out/.quenby-mine.tmp",
                                            "out/a_PassThrough.jpg"));
}

// What opens a file while a standard stream is closed gets its number.
TEST(Outputs, NeverTakeThePlaceOfAStandardStream) {
  const TemporaryFolder folder;
  const std::string a = folder.write("a.jpg", smallJpeg());
  const std::string trace = folder / "trace";
  const Finished run = shell("ASAN_OPTIONS=detect_leaks=0 strace -f -o " + trace +
                             " -e trace=openat $QUENBY enhance " + a + " -o " + folder / "b.jpg" +
                             " --filter PassThrough <&- >&- 2>&-");
  if (!folder.has("trace")) GTEST_SKIP() << "strace cannot trace here";
  EXPECT_EQ(run.exitCode, 0);
  const std::string calls = textOf(folder.read("trace"));
  const std::size_t at = calls.find(".tmp\"");
  ASSERT_NE(at, std::string::npos) << calls;
  const std::string line = calls.substr(at, calls.find('\n', at) - at);
  EXPECT_GT(std::stoi(line.substr(line.rfind('=') + 1)), 2) << line;
}

TEST(Outputs, ThatAreSpecialFilesStaySpecial) {
  const TemporaryFolder folder;
  const std::string in = folder.write("a.jpg", smallJpeg());
  EXPECT_EQ(enhance({in, "-o", "/dev/null"}).exitCode, 0);
  EXPECT_TRUE(std::filesystem::is_character_file("/dev/null"));
}

TEST(Plan, IsPrintedAndNothingIsDone) {
  const TemporaryFolder folder;
  const std::string a = folder.write("in/a.jpg", smallJpeg());
  const std::string b = folder.write("in/sub/b.jpg", smallJpeg());
  folder.write("out/a_PassThrough.jpg", std::string("old"));
  const auto before = folder.content();
  const Finished run = enhance({"-r", folder / "in", "-o", folder / "out", "-n"});
  EXPECT_EQ(run.exitCode, 0);
  EXPECT_EQ(run.output, a + " -> " + folder / "out/a_PassThrough.jpg" +
                            " (exists: skipped without --overwrite)\n" + b + " -> " +
                            folder / "out/sub/b_PassThrough.jpg" + "\n");
  const Finished json = enhance({"-r", folder / "in", "-o", folder / "out", "-n", "--json"});
  const nlohmann::json plan = parsedJson(json.output);
  EXPECT_EQ(plan[0]["status"], "exists");
  EXPECT_EQ(plan[1]["status"], "planned");
  EXPECT_EQ(folder.content(), before);
}

TEST(Plan, WithNothingLeftIsNothingToDo) {
  const TemporaryFolder folder;
  const std::string a = folder.write("a.jpg", smallJpeg());
  EXPECT_EQ(enhance({a, "-o", folder.write("b.jpg", smallJpeg()), "-n"}).exitCode, 3);
}

TEST(Plan, SaysWhatIsMissing) {
  const TemporaryFolder folder;
  const std::string a = folder.write("a.jpg", smallJpeg()), none = folder / "none.jpg";
  const Finished run = enhance({none, a, "-n", "--jsonl"});
  EXPECT_EQ(run.exitCode, 1);
  EXPECT_THAT(run.errors, HasSubstr(none + ": No such file or directory; check the path"));
  EXPECT_THAT(run.output, HasSubstr("\"failed\""));
  EXPECT_THAT(run.output, HasSubstr("\"planned\""));
  for (const std::vector<std::string>& verb :
       {std::vector<std::string>{"curve", none, "-o", folder / "c.png", "-n"},
        {"keypoints", none, "--draw", folder / "c.png", "-n"},
        {"score", none, "--map", folder / "c.png", "-n"},
        {"sheet", none, a, "-o", folder / "c.png", "-n"},
        {"masks", none, "-o", folder / "masks", "-n"}}) {
    const Finished plan = quenby(verb);
    EXPECT_EQ(plan.exitCode, 1) << verb[0];
    EXPECT_THAT(plan.errors, HasSubstr("none.jpg: No such file")) << verb[0];
  }
  EXPECT_EQ(quenby({"score", a, "--map", folder / "c.png", "-n"}).output,
            a + " -> " + folder / "c.png\n");
  EXPECT_THAT(folder.content(), ElementsAre("a.jpg"));
}

// `script` gives the command a terminal.
TEST(ProgressBar, AppearsOnATerminalOnly) {
  const TemporaryFolder folder;
  folder.write("in/a.jpg", smallJpeg());
  folder.write("in/b.jpg", smallJpeg());
  const std::string command =
      "$QUENBY enhance -r " + folder / "in" + " --overwrite -o " + folder.makeFolder("out");
  const auto onTerminal = [](const std::string& line) {
    return shell("export QUENBY; script -qec '" + line + "' /dev/null");
  };
  const Finished seen = onTerminal(command);
  EXPECT_EQ(seen.exitCode, 0) << seen.output;
  EXPECT_THAT(seen.output, HasSubstr("1/2"));
  EXPECT_THAT(seen.output, HasSubstr("[########################################] 2/2"));
  EXPECT_THAT(seen.output, HasSubstr(" 1/2  "));
  EXPECT_THAT(seen.output, HasSubstr("/s  0:"));
  EXPECT_THAT(onTerminal(command + " --progress none").output, Not(HasSubstr("1/2")));
  EXPECT_THAT(onTerminal(command + " -q").output, IsEmpty());
  EXPECT_THAT(shell(command).errors, testing::Not(HasSubstr("1/2")));
}

TEST(Quiet, SaysErrorsOnly) {
  const TemporaryFolder folder;
  const std::string a = folder.write("a.jpg", smallJpeg());
  const std::string b = folder.write("b.jpg", smallJpeg());
  const std::string out = folder.makeFolder("out");
  EXPECT_THAT(enhance({a, b, "-o", out, "--quiet"}).errors, IsEmpty());
  EXPECT_THAT(enhance({a, b, "-o", out, "--overwrite"}).errors, HasSubstr("2 of 2 photos done"));
  EXPECT_THAT(enhance({a, b, "-o", out, "-q"}).errors, IsEmpty());
  EXPECT_THAT(enhance({a, "-o", out, "-q"}).errors, IsEmpty());
  EXPECT_THAT(enhance({folder / "none", b, "-o", out, "-q"}).errors, HasSubstr("none: No such"));
}

}  // namespace
}  // namespace pelorin::test_support
