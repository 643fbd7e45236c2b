#include "photo/collection/ledger.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <filesystem>

#include "tests/support/temporary_folder.h"

namespace pelorin::photo {
namespace {

using test_support::TemporaryFolder;
using testing::HasSubstr;

const LedgerEntry done = {{1000, 1'700'000'000'000'000'001}, "out/a.jpg", FileStamp{7, -5}, false};
const LedgerEntry begun = {{1, 2}, "", {}, true};

TEST(Ledger, KnowsWhatAnEarlierProcessPutThere) {
  const TemporaryFolder folder;
  const std::string name = "/\xE9\n'.jpg";
  {
    Ledger ledger(folder / "ledger");
    EXPECT_EQ(ledger.find(name), nullptr);
    ledger.put(name, begun);
    ledger.put(name, done);
    ledger.put("b", begun);
  }
  Ledger again(folder / "ledger");
  ASSERT_NE(again.find(name), nullptr);
  EXPECT_EQ(*again.find(name), done);
  EXPECT_EQ(*again.find("b"), begun);
  EXPECT_EQ(again.takeTrouble(), "");
}

TEST(Ledger, IsItsUsersAlone) {
  const TemporaryFolder folder;
  const mode_t before = ::umask(0);
  const Ledger ledger(folder / "ledger");
  ::umask(before);
  for (const auto& entry : std::filesystem::directory_iterator(folder / "")) {
    struct stat status = {};
    ASSERT_EQ(::stat(entry.path().c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777, 0600u) << entry.path();
  }
}

TEST(Ledger, IsOneProcessesAtATime) {
  const TemporaryFolder folder;
  const Ledger ledger(folder / "ledger");
  EXPECT_THROW(Ledger(folder / "ledger"), LedgerInUse);
}

TEST(Ledger, SetsAsideWhatIsDamagedOrNoLedger) {
  const TemporaryFolder folder;
  { Ledger(folder / "ledger").put("a", done); }
  test_support::Bytes damaged = folder.read("ledger");
  for (std::size_t i = damaged.size() / 2; i < damaged.size(); ++i) damaged[i] ^= 0x55;
  const test_support::Bytes letter(2000, 'x');
  int number = 0;
  for (const test_support::Bytes& bytes : {damaged, letter}) {
    folder.write("ledger", bytes);
    Ledger ledger(folder / "ledger");
    const std::string aside = "ledger.damaged-" + std::to_string(++number);
    EXPECT_THAT(ledger.takeTrouble(), HasSubstr("set aside as " + folder / aside));
    EXPECT_EQ(folder.read(aside), bytes);
    EXPECT_EQ(ledger.find("a"), nullptr);
    ledger.put("a", done);
    EXPECT_EQ(*ledger.find("a"), done);
  }
}

TEST(Ledger, CountsUntilTheEndWhereItCannotBeWritten) {
  const TemporaryFolder folder;
  Ledger ledger(folder / "none/ledger");
  EXPECT_THAT(ledger.takeTrouble(), HasSubstr("cannot be used"));
  ledger.put("a", done);
  EXPECT_EQ(*ledger.find("a"), done);
}

}  // namespace
}  // namespace pelorin::photo
