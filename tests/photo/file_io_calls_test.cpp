#include <dlfcn.h>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <cerrno>
#include <cstdarg>
#include <string>
#include <system_error>
#include <vector>

#include "photo/file_io.h"
#include "tests/support/temporary_folder.h"

// What file_io asks of the system is seen here first: this program's functions come before those
// of the C library.
namespace {

std::vector<std::string> calls;
int fsyncError = 0, renameatError = 0, linkError = 0;

template <typename Function>
Function* next(const char* name) {
  return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}

}  // namespace

// Seen by libraries, too.
#pragma GCC visibility push(default)

extern "C" int fsync(int file) {
  struct stat status = {};
  fstat(file, &status);
  calls.push_back(S_ISDIR(status.st_mode) ? "sync folder" : "sync file");
  if (fsyncError == 0) return 0;
  errno = fsyncError;
  return -1;
}

extern "C" int rename(const char* from, const char* to) noexcept {
  calls.push_back("rename");
  return next<int(const char*, const char*)>("rename")(from, to);
}

extern "C" int link(const char* from, const char* to) noexcept {
  calls.push_back("link");
  if (linkError == 0) return next<int(const char*, const char*)>("link")(from, to);
  errno = linkError;
  return -1;
}

extern "C" long syscall(long number, ...) noexcept {
  std::va_list list;
  va_start(list, number);
  long given[6];
  for (long& argument : given) argument = va_arg(list, long);
  va_end(list);
  if (number == SYS_renameat2) {
    calls.push_back("renameat2");
    if (renameatError != 0) {
      errno = renameatError;
      return -1;
    }
  }
  return next<long(long, ...)>("syscall")(number, given[0], given[1], given[2], given[3], given[4],
                                          given[5]);
}

#pragma GCC visibility pop

namespace pelorin::photo {
namespace {

using Calls = std::vector<std::string>;
using test_support::Bytes;

class FileIoCalls : public testing::Test {
 protected:
  FileIoCalls() { calls.clear(); }
  ~FileIoCalls() override { fsyncError = renameatError = linkError = 0; }

  test_support::TemporaryFolder folder_;
};

int errorOf(const std::string& path, const ReplaceOptions& options = {}) {
  try {
    writeFileAtomically(path, Bytes{1, 2, 3}, options);
    return 0;
  } catch (const std::system_error& error) {
    return error.code().value();
  }
}

// After a power cut a name may be on the disk and the data not, unless it was synced before.
TEST_F(FileIoCalls, SyncTheFileBeforeItTakesItsPlaceAndTheFolderAfter) {
  EXPECT_EQ(errorOf(folder_ / "a"), 0);
  EXPECT_EQ(calls, (Calls{"sync file", "rename", "sync folder"}));
  calls.clear();
  EXPECT_EQ(errorOf(folder_ / "b", {.mayReplace = false}), 0);
  EXPECT_EQ(calls, (Calls{"sync file", "renameat2", "sync folder"}));
}

TEST_F(FileIoCalls, LeaveTheOldFileWhenItsSuccessorCannotReachTheDisk) {
  folder_.write("a", "old");
  fsyncError = EIO;
  EXPECT_EQ(errorOf(folder_ / "a"), EIO);
  EXPECT_EQ(calls, Calls{"sync file"});
  EXPECT_EQ(folder_.read("a"), (Bytes{'o', 'l', 'd'}));
  EXPECT_EQ(folder_.content().size(), 1u);
}

TEST_F(FileIoCalls, WriteWhereNothingCanBeSynced) {
  for (const int code : {EINVAL, EROFS, ENOTSUP}) {
    fsyncError = code;
    EXPECT_EQ(errorOf(folder_ / "a"), 0);
  }
}

TEST_F(FileIoCalls, NeverReplaceWithoutLeaveWhateverTheFileSystemLacks) {
  const ReplaceOptions newOnly = {.mayReplace = false};
  renameatError = EINVAL;
  for (const int linking : {0, EPERM}) {
    linkError = linking;
    const std::string name = linking == 0 ? "linked" : "kept";
    EXPECT_EQ(errorOf(folder_ / name, newOnly), 0);
    EXPECT_EQ(folder_.read(name), (Bytes{1, 2, 3}));
    Replacement late(folder_ / (name + " late"), Bytes{9}, newOnly);
    folder_.write(name + " late", "old");
    EXPECT_THROW(late.replace(), std::system_error);
    EXPECT_EQ(folder_.read(name + " late"), (Bytes{'o', 'l', 'd'}));
  }
  EXPECT_EQ(folder_.content(),
            (std::set<std::string>{"kept", "kept late", "linked", "linked late"}));
}

}  // namespace
}  // namespace pelorin::photo
