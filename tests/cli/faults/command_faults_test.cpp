#include <gmock/gmock.h>
#include <stdlib.h>

#include <algorithm>
#include <cstdlib>
#include <fstream>
#include <iostream>
#include <map>
#include <ostream>
#include <string>
#include <utility>
#include <vector>

#include "tests/cli/quenby_process.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using Words = std::vector<std::string>;

/// For one process: what is set is gone with the scope.
class Variable {
 public:
  Variable(const char* name, const std::string& value) : name_(name) {
    setenv(name, value.c_str(), 1);
  }
  ~Variable() { unsetenv(name_); }
  Variable(const Variable&) = delete;
  Variable& operator=(const Variable&) = delete;

 private:
  const char* name_;
};

struct Verb {
  std::string name;
  Words arguments;
  long least;  // calls that it made when this was written, some fewer
};

void PrintTo(const Verb& verb, std::ostream* out) {
  *out << verb.name;
}

/// Kinds of calls and what becomes of one, as failing_calls.cpp reads it.
struct Fault {
  std::string kind, how;
  bool isTriedAgain;  // so that nobody notices
};

class CommandFaults : public testing::TestWithParam<Verb> {
 protected:
  void SetUp() override {
    if (std::getenv("QUENBY_COMMAND") != nullptr)
      GTEST_SKIP() << "another command, such as one with sanitizers, makes calls of its own";
    folder.write("in.jpg", photo);
    folder.write("other.jpg", jpegOf(photoLikePicture(120, 110, 4)));
  }

  Finished run(const std::string& fault, const std::string& counts = "") {
    folder.write("out.jpg", old);
    Words arguments = GetParam().arguments;
    for (std::string& argument : arguments)
      if (argument.ends_with(".jpg")) argument = folder / argument;
    const Variable preload("LD_PRELOAD", FAILING_CALLS), which("QUENBY_FAULT", fault);
    if (counts.empty()) return quenby(arguments);
    const Variable file("QUENBY_FAULT_COUNTS", counts);
    return quenby(arguments);
  }

  std::map<std::string, long> countCalls() {
    const TemporaryFolder elsewhere;
    const std::string file = elsewhere / "counts";
    run("memory 0 0", file);
    std::map<std::string, long> counts;
    std::ifstream lines(file);
    long count;
    for (std::string kind; lines >> kind >> count;) counts[kind] = count;
    return counts;
  }

  const TemporaryFolder folder;
  const Bytes photo = jpegOf(photoLikePicture(128, 104, 3)), old = {'o', 'l', 'd'};
};

// With QUENBY_HARDEN every call fails in turn; otherwise some, spread over the run.
TEST_P(CommandFaults, AreOneLineAndAnExitCodeAndLeaveWholeFiles) {
  const Fault faults[] = {
      {"memory", "once", false}, {"memory", "later", false}, {"read", "5", false},
      {"read", "4", true},       {"read", "short", true},    {"write", "28", false},
      {"write", "4", true},      {"write", "short", true},   {"open", "24", false},
      {"open", "4", true},       {"close", "5", false},      {"close", "4", true},
      {"rename", "5", false},    {"sync", "5", false},       {"sync", "4", true},
      {"map", "12", false},      {"stat", "5", false}};
  std::map<std::string, long> counts = countCalls();
  const Finished clean = run("memory 0 0");
  ASSERT_EQ(clean.exitCode, 0) << clean.errors;
  const Bytes expected = folder.read("out.jpg");
  const auto content = folder.content();
  ASSERT_GT(counts["memory"], GetParam().least);
  for (const char* kind : {"read", "open", "close", "stat"}) ASSERT_GT(counts[kind], 0) << kind;
  const bool all = std::getenv("QUENBY_HARDEN") != nullptr;
  std::map<std::string, long> tried;
  long endedByTheLibrary = 0;
  for (const Fault& fault : faults) {
    const long step = all ? 1 : std::max(counts[fault.kind] / 6, 1L);
    for (long number = 1; number <= counts[fault.kind]; number += step) {
      const std::string place = fault.kind + " " + std::to_string(number) + " " + fault.how;
      SCOPED_TRACE(place);
      const Finished faulty = run(place);
      ++tried[fault.kind];
      const Bytes left = folder.read("out.jpg");
      EXPECT_EQ(folder.read("in.jpg"), photo);
      EXPECT_EQ(folder.content(), content);
      if (faulty.exitCode == 0 || fault.isTriedAgain) {
        EXPECT_EQ(faulty.exitCode, 0) << faulty.errors;
        EXPECT_EQ(faulty.output, clean.output);
        EXPECT_EQ(left, expected);
      } else if (faulty.errors.starts_with("Fatal glibc error")) {
        // The C library itself ends a process that has no memory for a thread's destructors.
        EXPECT_EQ(left, old);
        ++endedByTheLibrary;
      } else {
        // A photo that is whole may be called failed, when what comes after it goes wrong.
        EXPECT_EQ(faulty.exitCode, 1) << faulty.errors;
        EXPECT_TRUE(left == old || left == expected);
        EXPECT_EQ(std::ranges::count(faulty.errors, '\n'), 1) << faulty.errors;
        EXPECT_TRUE(faulty.errors.starts_with("quenby")) << faulty.errors;
      }
      if (HasFailure()) return;
    }
  }
  for (const auto& [kind, count] : tried) std::cout << kind << ' ' << count << '\n';
  EXPECT_LE(endedByTheLibrary, 2);
  EXPECT_EQ(run("memory 0 0").output, clean.output);
  EXPECT_EQ(folder.read("out.jpg"), expected);
}

INSTANTIATE_TEST_SUITE_P(
    Of, CommandFaults,
    testing::Values(
        Verb{"enhance",
             {"enhance", "-q", "--threads", "1", "in.jpg", "-o", "out.jpg", "--overwrite"},
             2000},
        Verb{"faces",
             {"enhance", "-q", "--threads", "1", "in.jpg", "-o", "out.jpg", "--overwrite", "--face",
              "10,10,60,60", "--face", "20,20,50,50", "--face", "70,20,100,50"},
             2000},
        Verb{"look",
             {"look", "winter", "-q", "--threads", "1", "in.jpg", "-o", "out.jpg", "--overwrite"},
             2500},
        Verb{"info", {"info", "--json", "in.jpg"}, 600}, Verb{"score", {"score", "in.jpg"}, 600},
        Verb{"compare", {"compare", "in.jpg", "other.jpg"}, 400}),
    [](const auto& verb) { return verb.param.name; });

}  // namespace
}  // namespace pelorin::test_support
