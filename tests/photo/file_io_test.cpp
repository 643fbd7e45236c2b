#include "photo/file_io.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/xattr.h>
#include <unistd.h>

#include <csignal>
#include <filesystem>
#include <fstream>
#include <numeric>
#include <system_error>
#include <thread>

#include "photo/photo_error.h"

namespace pelorin::photo {
namespace {

namespace fs = std::filesystem;
using Bytes = std::vector<std::uint8_t>;

template <typename Action>
int errorNumberOf(const Action& action) {
  try {
    action();
  } catch (const std::system_error& error) {
    return error.code().value();
  }
  return 0;
}

class FileIo : public testing::Test {
 protected:
  FileIo() {
    std::string name = (fs::temp_directory_path() / "file_io_test.XXXXXX").string();
    folder_ = ::mkdtemp(name.data());
  }
  ~FileIo() override { fs::remove_all(folder_); }

  std::string path(const std::string& name) const { return (folder_ / name).string(); }

  std::size_t entries() const {
    return static_cast<std::size_t>(std::distance(fs::directory_iterator(folder_), {}));
  }

  fs::path folder_;
};

Bytes countingBytes(std::size_t count) {
  Bytes bytes(count);
  std::iota(bytes.begin(), bytes.end(), std::uint8_t{0});
  return bytes;
}

mode_t permissionsOf(const std::string& path) {
  struct stat status = {};
  EXPECT_EQ(::stat(path.c_str(), &status), 0);
  return status.st_mode & 07777;
}

// No file of this process may grow beyond `bytes`; as before at the end of the scope.
class FileSizeLimit {
 public:
  explicit FileSizeLimit(rlim_t bytes) : oldAction_(std::signal(SIGXFSZ, SIG_IGN)) {
    ::getrlimit(RLIMIT_FSIZE, &old_);
    const rlimit limit = {bytes, old_.rlim_max};
    ::setrlimit(RLIMIT_FSIZE, &limit);
  }
  ~FileSizeLimit() {
    ::setrlimit(RLIMIT_FSIZE, &old_);
    std::signal(SIGXFSZ, oldAction_);
  }
  FileSizeLimit(const FileSizeLimit&) = delete;
  FileSizeLimit& operator=(const FileSizeLimit&) = delete;

 private:
  rlimit old_ = {};
  void (*oldAction_)(int);
};

// Root may do everything: for this scope the tests are somebody else, who owns `folder`.
class AsOrdinaryUser {
 public:
  explicit AsOrdinaryUser(const fs::path& folder) {
    if (user_ != 0) return;
    EXPECT_EQ(::chown(folder.c_str(), nobody, nobody), 0);
    EXPECT_EQ(::seteuid(nobody), 0);
  }
  ~AsOrdinaryUser() { EXPECT_EQ(::seteuid(user_), 0); }
  AsOrdinaryUser(const AsOrdinaryUser&) = delete;
  AsOrdinaryUser& operator=(const AsOrdinaryUser&) = delete;

 private:
  static constexpr uid_t nobody = 65534;
  uid_t user_ = ::geteuid();
};

TEST_F(FileIo, ReadsWhatItWrote) {
  for (const std::size_t size : {0u, 1u, 65535u, 65536u, 1'000'000u}) {
    const Bytes bytes = countingBytes(size);
    writeFileAtomically(path("file"), bytes);
    EXPECT_EQ(readFile(path("file")), bytes);
  }
  EXPECT_EQ(entries(), 1u);
}

TEST_F(FileIo, ReadsPipesToTheirEnd) {
  ASSERT_EQ(::mkfifo(path("pipe").c_str(), 0600), 0);
  const Bytes bytes = countingBytes(300'000);
  // Written directly too: a pipe is not replaced by a file.
  std::thread writer([&] { writeFileAtomically(path("pipe"), bytes); });
  EXPECT_EQ(readFile(path("pipe")), bytes);
  writer.join();
  EXPECT_EQ(fs::status(path("pipe")).type(), fs::file_type::fifo);
  EXPECT_EQ(entries(), 1u);
}

TEST_F(FileIo, SaysWhyAFileCannotBeRead) {
  writeFileAtomically(path("file"), {});
  EXPECT_EQ(errorNumberOf([&] { readFile(path("missing")); }), ENOENT);
  EXPECT_EQ(errorNumberOf([&] { readFile(path("")); }), EISDIR);
  EXPECT_EQ(errorNumberOf([&] { readFile(path("file") + "/below"); }), ENOTDIR);
  EXPECT_EQ(errorNumberOf([&] { readFile(""); }), ENOENT);
}

TEST_F(FileIo, RefusesToReadAFileTooLargeForAnyPhoto) {
  writeFileAtomically(path("file"), {});
  fs::resize_file(path("file"), (std::uintmax_t{1} << 30) + 1);  // a hole, not bytes on the disk
  EXPECT_THROW(readFile(path("file")), PhotoError);
  EXPECT_THROW(readFile("/dev/zero", {.largest = 100'000}), PhotoError);
  writeFileAtomically(path("file"), countingBytes(10));
  EXPECT_EQ(readFile(path("file"), {.largest = 10}).size(), 10u);
  EXPECT_THROW(readFile(path("file"), {.largest = 9}), PhotoError);
}

TEST_F(FileIo, WaitsForNobodyAtTheOtherEndOfAPipeForEver) {
  ASSERT_EQ(::mkfifo(path("pipe").c_str(), 0600), 0);
  const Waiting none = {.patience = std::chrono::milliseconds(0)};
  EXPECT_THROW(readFile(path("pipe"), {.wait = none}), PhotoError);
  EXPECT_THROW(writeFileAtomically(path("pipe"), countingBytes(10), {.wait = none}), PhotoError);
  std::stop_source stopped;
  stopped.request_stop();
  const Waiting stop = {.stop = stopped.get_token()};
  EXPECT_THROW(readFile(path("pipe"), {.wait = stop}), Stopped);
  EXPECT_THROW(writeFileAtomically(path("pipe"), countingBytes(10), {.wait = stop}), Stopped);
}

TEST_F(FileIo, RemovesItsTemporariesWhenTheProcessIsToEnd) {
  const Replacement replacement(path("new"), countingBytes(10));
  EXPECT_EQ(entries(), 1u);
  removeTemporaries();
  EXPECT_EQ(entries(), 0u);
}

TEST_F(FileIo, SaysWhyAFileCannotBeWrittenAndLeavesNothingBehind) {
  writeFileAtomically(path("file"), countingBytes(10));
  fs::create_directory(path("sub"));
  EXPECT_EQ(errorNumberOf([&] { writeFileAtomically(path("missing/file"), {}); }), ENOENT);
  EXPECT_EQ(errorNumberOf([&] { writeFileAtomically(path("file") + "/below", {}); }), ENOTDIR);
  EXPECT_EQ(errorNumberOf([&] { writeFileAtomically(path("sub"), {}); }), EISDIR);
  EXPECT_EQ(errorNumberOf([&] { writeFileAtomically("", {}); }), ENOENT);
  EXPECT_EQ(errorNumberOf([&] { writeFileAtomically(path(std::string(300, 'n')), {}); }),
            ENAMETOOLONG);
  EXPECT_EQ(entries(), 2u);
  EXPECT_TRUE(fs::is_empty(path("sub")));
  EXPECT_EQ(readFile(path("file")), countingBytes(10));
}

TEST_F(FileIo, LeavesTheOldFileWhenTheDiskIsFull) {
  writeFileAtomically(path("file"), countingBytes(10));
  {
    const FileSizeLimit limit(100'000);
    EXPECT_EQ(errorNumberOf([&] { writeFileAtomically(path("file"), Bytes(200'000)); }), EFBIG);
    EXPECT_EQ(errorNumberOf([&] { writeFileAtomically(path("new"), Bytes(200'000)); }), EFBIG);
  }
  EXPECT_EQ(readFile(path("file")), countingBytes(10));
  EXPECT_EQ(entries(), 1u);
}

TEST_F(FileIo, SeesThatADeviceIsFull) {
  EXPECT_EQ(errorNumberOf([&] { writeFileAtomically("/dev/full", Bytes(10)); }), ENOSPC);
  EXPECT_TRUE(fs::is_character_file("/dev/full"));
}

TEST_F(FileIo, KeepsThePermissionsOfTheFileItReplaces) {
  for (const mode_t permissions : {0600u, 0640u, 0666u, 0755u}) {
    writeFileAtomically(path("file"), {});
    ASSERT_EQ(::chmod(path("file").c_str(), permissions), 0);
    writeFileAtomically(path("file"), countingBytes(5));
    EXPECT_EQ(permissionsOf(path("file")), permissions);
  }
}

TEST_F(FileIo, GivesANewFileThePermissionsOfTheUmask) {
  const mode_t old = ::umask(027);
  writeFileAtomically(path("file"), {});
  ::umask(old);
  EXPECT_EQ(permissionsOf(path("file")), 0640u);
}

/// Bytes that look at the only file in a folder while they are written there.
class Onlooker : public ByteSource {
 public:
  explicit Onlooker(std::string folder) : folder_(std::move(folder)) {}
  std::uint64_t size() const override { return 1000; }
  void read(std::uint64_t, std::span<std::uint8_t> bytes) override {
    std::ranges::fill(bytes, std::uint8_t{7});
    for (const auto& entry : fs::directory_iterator(folder_))
      if (entry.path().filename().string().starts_with(".quenby-"))
        seen.push_back(permissionsOf(entry.path()));
  }

  std::vector<mode_t> seen;

 private:
  const std::string folder_;
};

TEST_F(FileIo, WritesForItsUserAloneUntilAFileIsWhole) {
  const mode_t old = ::umask(0);
  for (int round = 0; round < 2; ++round) {  // a new file, then one in its place
    Onlooker rest(folder_);
    writeFileAtomically(path("file"), FileView(std::span<const std::uint8_t>(), &rest));
    EXPECT_EQ(rest.seen, std::vector<mode_t>{0600u});
    EXPECT_EQ(permissionsOf(path("file")), 0666u);
  }
  ::umask(old);
}

TEST_F(FileIo, DoesNotReplaceAProtectedFile) {
  const AsOrdinaryUser user(folder_);
  writeFileAtomically(path("file"), countingBytes(5));
  ASSERT_EQ(::chmod(path("file").c_str(), 0400), 0);
  EXPECT_EQ(errorNumberOf([&] { writeFileAtomically(path("file"), {}); }), EACCES);
  EXPECT_EQ(readFile(path("file")), countingBytes(5));
}

TEST_F(FileIo, NeedsAFileItMayRead) {
  const AsOrdinaryUser user(folder_);
  writeFileAtomically(path("file"), countingBytes(5));
  ASSERT_EQ(::chmod(path("file").c_str(), 0200), 0);
  EXPECT_EQ(errorNumberOf([&] { readFile(path("file")); }), EACCES);
}

TEST_F(FileIo, NeedsAFolderItMayWriteTo) {
  const AsOrdinaryUser user(folder_);
  fs::create_directory(path("sub"));
  ASSERT_EQ(::chmod(path("sub").c_str(), 0500), 0);
  EXPECT_EQ(errorNumberOf([&] { writeFileAtomically(path("sub/file"), {}); }), EACCES);
  EXPECT_TRUE(fs::is_empty(path("sub")));
}

TEST_F(FileIo, ReplacesTheFileASymbolicLinkNames) {
  fs::create_directory(path("sub"));
  writeFileAtomically(path("sub/real"), countingBytes(3));
  fs::create_symlink("sub/real", path("link"));
  fs::create_symlink(path("link"), path("second"));
  writeFileAtomically(path("second"), countingBytes(9));
  EXPECT_TRUE(fs::is_symlink(path("link")));
  EXPECT_TRUE(fs::is_symlink(path("second")));
  EXPECT_FALSE(fs::is_symlink(path("sub/real")));
  EXPECT_EQ(readFile(path("sub/real")), countingBytes(9));
}

TEST_F(FileIo, MakesTheFileADanglingLinkNames) {
  fs::create_symlink("real", path("link"));
  writeFileAtomically(path("link"), countingBytes(9));
  EXPECT_TRUE(fs::is_symlink(path("link")));
  EXPECT_EQ(readFile(path("real")), countingBytes(9));
}

TEST_F(FileIo, SaysThatLinksGoRound) {
  fs::create_symlink("b", path("a"));
  fs::create_symlink("a", path("b"));
  EXPECT_EQ(errorNumberOf([&] { writeFileAtomically(path("a"), {}); }), ELOOP);
  EXPECT_EQ(entries(), 2u);
}

TEST_F(FileIo, LeavesAnotherHardLinkWithTheOldContents) {
  writeFileAtomically(path("file"), countingBytes(3));
  fs::create_hard_link(path("file"), path("other"));
  writeFileAtomically(path("file"), countingBytes(9));
  EXPECT_EQ(readFile(path("other")), countingBytes(3));
}

TEST_F(FileIo, WritesAFileWithoutANameDirectly) {
  const std::string name = path("gone");
  const int descriptor = ::open(name.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0600);
  fs::remove(name);
  const std::string way = "/proc/self/fd/" + std::to_string(descriptor);
  for (const std::size_t size : {100, 7}) {
    writeFileAtomically(way, countingBytes(size));
    EXPECT_EQ(readFile(way), countingBytes(size));
  }
  EXPECT_EQ(entries(), 0u);
  ::close(descriptor);
}

TEST_F(FileIo, LeavesTheOldFileUntilTheReplacementTakesItsPlace) {
  writeFileAtomically(path("a"), countingBytes(3));
  { const Replacement dropped(path("a"), countingBytes(9)); }
  EXPECT_EQ(entries(), 1u);
  Replacement replacement(path("a"), countingBytes(9));
  EXPECT_EQ(readFile(path("a")), countingBytes(3));
  replacement.replace();
  EXPECT_EQ(readFile(path("a")), countingBytes(9));
  EXPECT_EQ(entries(), 1u);
}

TEST_F(FileIo, DoesNotReplaceAFileThatAppearedMeanwhile) {
  const ReplaceOptions newOnly = {.mayReplace = false};
  Replacement replacement(path("file"), countingBytes(9), newOnly);
  writeFileAtomically(path("file"), countingBytes(3));
  EXPECT_EQ(errorNumberOf([&] { replacement.replace(); }), EEXIST);
  EXPECT_EQ(errorNumberOf([&] { writeFileAtomically(path("file"), {}, newOnly); }), EEXIST);
  EXPECT_EQ(readFile(path("file")), countingBytes(3));
  writeFileAtomically(path("new"), countingBytes(4), newOnly);
  EXPECT_EQ(readFile(path("new")), countingBytes(4));
  writeFileAtomically("/dev/null", countingBytes(4), newOnly);  // nothing to lose
}

TEST_F(FileIo, KeepsTheTimesOfTheFileItReplacesWhenAsked) {
  writeFileAtomically(path("file"), countingBytes(3));
  const timespec times[] = {{1'000'000'000, 5}, {1'100'000'000, 7}};
  ASSERT_EQ(::utimensat(AT_FDCWD, path("file").c_str(), times, 0), 0);
  writeFileAtomically(path("file"), countingBytes(4), {.keepTimes = true});
  struct stat status = {};
  ASSERT_EQ(::stat(path("file").c_str(), &status), 0);
  EXPECT_EQ(status.st_mtim.tv_sec, 1'100'000'000);
  EXPECT_EQ(status.st_mtim.tv_nsec, 7);
  EXPECT_EQ(status.st_size, 4);
  writeFileAtomically(path("file"), countingBytes(5));
  ASSERT_EQ(::stat(path("file").c_str(), &status), 0);
  EXPECT_GT(status.st_mtim.tv_sec, 1'100'000'000);
}

TEST_F(FileIo, KeepsTheExtendedAttributesOfTheFileItReplaces) {
  writeFileAtomically(path("file"), countingBytes(3));
  const std::string tag = "holiday";
  if (::setxattr(path("file").c_str(), "user.tag", tag.data(), tag.size(), 0) != 0) {
    GTEST_SKIP() << "no extended attributes in the folder for temporary files";
  }
  writeFileAtomically(path("file"), countingBytes(4));
  std::string kept(100, ' ');
  const ssize_t size = ::getxattr(path("file").c_str(), "user.tag", kept.data(), kept.size());
  ASSERT_EQ(size, static_cast<ssize_t>(tag.size()));
  EXPECT_EQ(kept.substr(0, tag.size()), tag);
}

TEST_F(FileIo, SweepsWhatKilledProcessesLeft) {
  for (const char* name : {".quenby-12-0.tmp", ".quenby-12-1.tmp", ".quenby-a-1.tmp", "a.tmp",
                           ".quenby-.tmp", ".quenby-1-1.tmp.jpg"}) {
    writeFileAtomically(path(name), countingBytes(3));
  }
  fs::create_directory(path(".quenby-3-3.tmp"));
  Replacement written(path("file"), countingBytes(9));
  sweepLeftovers(folder_.string());
  EXPECT_FALSE(fs::exists(path(".quenby-12-0.tmp")));
  EXPECT_FALSE(fs::exists(path(".quenby-12-1.tmp")));
  EXPECT_EQ(entries(), 6u);
  written.replace();
  EXPECT_EQ(readFile(path("file")), countingBytes(9));
  sweepLeftovers(path("missing"));
}

TEST_F(FileIo, LeavesOneWholeFileWhenSeveralThreadsWriteIt) {
  std::vector<std::thread> writers;
  for (std::uint8_t value = 0; value < 4; ++value) {
    writers.emplace_back([this, value] {
      for (int i = 0; i < 20; ++i) writeFileAtomically(path("file"), Bytes(100'000, value));
    });
  }
  for (std::thread& writer : writers) writer.join();
  const Bytes bytes = readFile(path("file"));
  EXPECT_EQ(bytes, Bytes(100'000, bytes[0]));
  EXPECT_EQ(entries(), 1u);
}

}  // namespace
}  // namespace pelorin::photo
