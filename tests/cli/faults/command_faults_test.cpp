#include <gmock/gmock.h>
#include <stdlib.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <map>
#include <ostream>
#include <random>
#include <set>
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
  std::string made = "out.jpg";
  bool hasDatabase = false;
};

void PrintTo(const Verb& verb, std::ostream* out) {
  *out << verb.name;
}

/// Kinds of calls and what becomes of one, as failing_calls.cpp reads it.
struct Fault {
  std::string kind, how;
  bool isTriedAgain;  // so that nobody notices
};

/// Which call of a kind, and what becomes of it.
struct Trial {
  const Fault* fault;
  long number;
};

class CommandFaults : public testing::TestWithParam<Verb> {
 protected:
  void SetUp() override {
    if (std::getenv("QUENBY_COMMAND") != nullptr)
      GTEST_SKIP() << "another command, such as one with sanitizers, makes calls of its own";
    std::filesystem::create_directory(folder / "incoming");
    folder.write("in.jpg", photo);
    folder.write("incoming/in.jpg", photo);
    folder.write("other.jpg", jpegOf(photoLikePicture(120, 110, 4)));
  }

  Finished run(const std::string& fault, const std::string& counts = "") {
    folder.write("out.jpg", old);
    for (const std::string& name : folder.content())
      if (!given.contains(name)) std::filesystem::remove_all(folder / name);
    return runAgain(fault, counts);
  }

  /// On top of what the last run left.
  Finished runAgain(const std::string& fault, const std::string& counts = "") {
    Words arguments = GetParam().arguments;
    for (std::string& argument : arguments)
      if (argument.ends_with(".jpg") || argument.ends_with(".cache") || argument == "incoming" ||
          argument == "results")
        argument = folder / argument;
    const Variable preload("LD_PRELOAD", FAILING_CALLS), which("QUENBY_FAULT", fault);
    if (counts.empty()) return quenby(arguments);
    const Variable file("QUENBY_FAULT_COUNTS", counts);
    return quenby(arguments);
  }

  /// What the verb made, or what stood there before.
  Bytes made() const {
    return std::filesystem::exists(folder / GetParam().made) ? folder.read(GetParam().made) : old;
  }

  /// What SQLite left because it could not end well is taken up by the next run, which ends well.
  void expectThatTheNextRunEndsWhatIsLeft(const std::set<std::string>& content) {
    std::set<std::string> left = folder.content();
    std::erase_if(left, [&](const std::string& name) { return content.contains(name); });
    if (left.empty()) return;
    ASSERT_TRUE(GetParam().hasDatabase) << *left.begin();
    for (const std::string& name : left) {
      const std::size_t end = name.rfind('-');
      EXPECT_TRUE(content.contains(name.substr(0, end))) << name;
      EXPECT_THAT(name.substr(end + 1), testing::AnyOf("wal", "shm", "journal"));
    }
    const Finished next = runAgain("memory 0 0");
    EXPECT_THAT(next.exitCode, testing::AnyOf(0, 3)) << next.errors;  // 3: it was done already
    EXPECT_THAT(folder.content(), testing::IsSubsetOf(content));
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
  const std::set<std::string> given = {"in.jpg", "other.jpg", "out.jpg", "incoming/",
                                       "incoming/in.jpg"};
  const Bytes photo = jpegOf(photoLikePicture(128, 104, 3)), old = {'o', 'l', 'd'};
};

// Some calls, spread over the run. With QUENBY_HARDEN=SECONDS as many as that time allows in any order, and
// every call in turn with 0.
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
  const Bytes expected = made();
  const auto content = folder.content();
  ASSERT_GT(counts["memory"], GetParam().least);
  for (const char* kind : {"read", "open", "close", "stat"}) ASSERT_GT(counts[kind], 0) << kind;
  const char* const harden = std::getenv("QUENBY_HARDEN");
  const long some = GetParam().hasDatabase ? 2 : 4;  // databases are synced, which takes long
  std::vector<Trial> trials;
  for (const Fault& fault : faults) {
    const long step = harden != nullptr ? 1 : std::max(counts[fault.kind] / some, 1L);
    // SQLite and the C++ library's folders give up where we try again.
    const bool isTheirs = GetParam().hasDatabase && (fault.kind == "sync" || fault.kind == "open");
    if (isTheirs && fault.isTriedAgain) continue;
    for (long number = 1; number <= counts[fault.kind]; number += step)
      trials.push_back({&fault, number});
  }
  using Clock = std::chrono::steady_clock;
  auto end = Clock::time_point::max();
  if (const long seconds = harden != nullptr ? std::atol(harden) : 0; seconds > 0) {
    std::shuffle(trials.begin(), trials.end(), std::mt19937(7));
    end = Clock::now() + std::chrono::seconds(seconds);
  }
  std::map<std::string, long> tried;
  for (const Trial& trial : trials) {
    if (Clock::now() > end) break;
    const Fault& fault = *trial.fault;
    const std::string place = fault.kind + " " + std::to_string(trial.number) + " " + fault.how;
    SCOPED_TRACE(place);
    const Finished faulty = run(place);
    ++tried[fault.kind];
    const Bytes left = made();
    EXPECT_EQ(folder.read("in.jpg"), photo);
    if (faulty.exitCode == 0 || fault.isTriedAgain) {
      EXPECT_EQ(faulty.exitCode, 0) << faulty.errors;
      EXPECT_EQ(faulty.output, clean.output);
      EXPECT_EQ(left, expected);
    } else {
      // A photo that is whole may be called failed, when what comes after it goes wrong.
      EXPECT_EQ(faulty.exitCode, 1) << faulty.errors;
      EXPECT_TRUE(left == old || left == expected);
      EXPECT_EQ(std::ranges::count(faulty.errors, '\n'), 1) << faulty.errors;
      EXPECT_TRUE(faulty.errors.starts_with("quenby")) << faulty.errors;
    }
    expectThatTheNextRunEndsWhatIsLeft(content);
    if (HasFailure()) return;
  }
  for (const auto& [kind, count] : tried) std::cout << kind << ' ' << count << '\n';
  EXPECT_EQ(run("memory 0 0").output, clean.output);
  EXPECT_EQ(made(), expected);
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
        Verb{"compare", {"compare", "in.jpg", "other.jpg"}, 400},
        Verb{"keypoints", {"keypoints", "in.jpg", "--json"}, 400},
        Verb{"curve", {"curve", "in.jpg", "--text"}, 400},
        Verb{"masks", {"masks", "in.jpg", "-o", "results"}, 400, "results/bilateral.png"},
        Verb{"dupes",
             {"dupes", "-q", "--json", "-j", "1", "in.jpg", "other.jpg", "--cache", "photos.cache"},
             600,
             "out.jpg",
             true},
        Verb{"watch",
             {"watch", "incoming", "-o", "results", "--once", "-q", "-j", "1", "--threads", "1",
              "--settle", "1"},
             2000,
             "results/in_AE0.jpg",
             true}),
    [](const auto& verb) { return verb.param.name; });

}  // namespace
}  // namespace pelorin::test_support
