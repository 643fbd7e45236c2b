#include "photo/collection/photo_cache.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sqlite3.h>
#include <sys/stat.h>

#include <cmath>
#include <filesystem>
#include <limits>
#include <thread>

#include "tests/dupe/synthetic_cdfs.h"
#include "tests/support/temporary_folder.h"

namespace pelorin::photo {
namespace {

using test_support::Bytes;
using test_support::TemporaryFolder;
using testing::HasSubstr;

constexpr FileStamp stamp = {1000, 1'700'000'000'123'456'789};

PhotoRecord recordOf(std::uint64_t seed) {
  return {4000, 3000, 6, CaptureTime{"2024-05-01T12:00:00.5+02:00", 1714557600.5, true, 7200},
          test_support::syntheticCDF(seed)};
}

void expectSame(const std::optional<PhotoRecord>& actual, const PhotoRecord& expected) {
  ASSERT_TRUE(actual.has_value());
  EXPECT_EQ(actual->width, expected.width);
  EXPECT_EQ(actual->height, expected.height);
  EXPECT_EQ(actual->orientation, expected.orientation);
  EXPECT_EQ(actual->cdf.unpacked(), expected.cdf.unpacked());
  ASSERT_EQ(actual->captureTime.has_value(), expected.captureTime.has_value());
  if (!expected.captureTime) return;
  EXPECT_EQ(actual->captureTime->text, expected.captureTime->text);
  EXPECT_EQ(actual->captureTime->seconds, expected.captureTime->seconds);
  EXPECT_EQ(actual->captureTime->hasZone, expected.captureTime->hasZone);
  EXPECT_EQ(actual->captureTime->zoneSeconds, expected.captureTime->zoneSeconds);
}

void changeDatabase(const std::string& file, const std::string& sql) {
  sqlite3* database = nullptr;
  ASSERT_EQ(sqlite3_open(file.c_str(), &database), SQLITE_OK);
  EXPECT_EQ(sqlite3_exec(database, sql.c_str(), nullptr, nullptr, nullptr), SQLITE_OK);
  sqlite3_close(database);
}

std::string refusalOf(const std::string& file) {
  try {
    PhotoCache cache(file);
    cache.find("a.jpg", stamp, 8);
  } catch (const CacheError& error) {
    return error.what();
  }
  return "";
}

TEST(PhotoCache, GivesBackWhatWasStored) {
  const TemporaryFolder folder;
  PhotoRecord withoutTime = recordOf(2), withoutZone = recordOf(3);
  withoutTime.captureTime.reset();
  withoutZone.captureTime->hasZone = false;
  withoutZone.captureTime->zoneSeconds = 0;
  {
    PhotoCache cache(folder / "cache");
    cache.store("a.jpg", stamp, 8, recordOf(1));
    cache.store("b.jpg", stamp, 8, withoutTime);
    cache.store("odd \xFF\n'name.jpg", stamp, 8, withoutZone);
    expectSame(cache.find("a.jpg", stamp, 8), recordOf(1));
  }
  PhotoCache cache(folder / "cache");
  expectSame(cache.find("a.jpg", stamp, 8), recordOf(1));
  expectSame(cache.find("b.jpg", stamp, 8), withoutTime);
  expectSame(cache.find("odd \xFF\n'name.jpg", stamp, 8), withoutZone);
  expectSame(cache.find("./folder/../a.jpg", stamp, 8), recordOf(1));
}

TEST(PhotoCache, IsItsUsersAlone) {
  const TemporaryFolder folder;
  const mode_t before = ::umask(0);
  PhotoCache cache(folder / "cache");
  cache.storeScore("a.jpg", {1, 2}, 3.0f);
  ::umask(before);
  for (const auto& entry : std::filesystem::directory_iterator(folder / "")) {
    struct stat status = {};
    ASSERT_EQ(::stat(entry.path().c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777, 0600u) << entry.path();
  }
}

TEST(PhotoCache, ForgetsAPhotoThatChangedOrIsReadAtAnotherScale) {
  const TemporaryFolder folder;
  PhotoCache cache(folder / "cache");
  cache.store("a.jpg", stamp, 8, recordOf(1));
  EXPECT_FALSE(cache.find("b.jpg", stamp, 8));
  EXPECT_FALSE(cache.find("a.jpg", stamp, 4));
  EXPECT_FALSE(cache.find("a.jpg", {stamp.bytes + 1, stamp.modified}, 8));
  EXPECT_FALSE(cache.find("a.jpg", {stamp.bytes, stamp.modified + 1}, 8));
  cache.store("a.jpg", {7, 8}, 8, recordOf(2));
  expectSame(cache.find("a.jpg", {7, 8}, 8), recordOf(2));
  EXPECT_FALSE(cache.find("a.jpg", stamp, 8));
}

TEST(PhotoCache, GivesBackScoresAndThatAPhotoIsTooSmallForOne) {
  const TemporaryFolder folder;
  {
    PhotoCache cache(folder / "cache");
    cache.storeScore("a.jpg", stamp, 4.1234567f);
    cache.storeScore("small.jpg", stamp, std::numeric_limits<float>::quiet_NaN());
    cache.store("unscored.jpg", stamp, 8, recordOf(1));
  }
  PhotoCache cache(folder / "cache");
  EXPECT_EQ(cache.findScore("./folder/../a.jpg", stamp), 4.1234567f);
  const std::optional<float> small = cache.findScore("small.jpg", stamp);
  EXPECT_TRUE(small && std::isnan(*small));
  EXPECT_FALSE(cache.findScore("unscored.jpg", stamp));
  EXPECT_FALSE(cache.find("a.jpg", stamp, 8));
}

TEST(PhotoCache, ForgetsTheScoreOfAPhotoThatChanged) {
  const TemporaryFolder folder;
  PhotoCache cache(folder / "cache");
  cache.storeScore("a.jpg", stamp, 4.0f);
  EXPECT_FALSE(cache.findScore("a.jpg", {stamp.bytes + 1, stamp.modified}));
  EXPECT_FALSE(cache.findScore("a.jpg", {stamp.bytes, stamp.modified + 1}));
  cache.storeScore("a.jpg", {7, 8}, 5.0f);
  EXPECT_EQ(cache.findScore("a.jpg", {7, 8}), 5.0f);
  EXPECT_FALSE(cache.findScore("a.jpg", stamp));
}

TEST(PhotoCache, ForgetsAScoreUnderAnotherModel) {
  const TemporaryFolder folder;
  PhotoCache cache(folder / "cache");
  cache.storeScore("a.jpg", stamp, 4.0f);
  changeDatabase(folder / "cache", "UPDATE scores SET model = 'another'");
  EXPECT_FALSE(cache.findScore("a.jpg", stamp));
}

TEST(PhotoCache, RefusesAFileOfAnotherKindAndLeavesItAsItWas) {
  const TemporaryFolder folder;
  for (const std::string& content :
       {std::string("a letter to a friend, not a database, and long enough to be one"),
        std::string(5000, '\0'), std::string("SQLite format 3") + '\0' + std::string(200, 'x')}) {
    folder.write("letter", content);
    EXPECT_THAT(refusalOf(folder / "letter"), HasSubstr("delete the file or name another"));
    EXPECT_EQ(folder.read("letter"), Bytes(content.begin(), content.end()));
    EXPECT_EQ(folder.content(), std::set<std::string>{"letter"});
  }
}

TEST(PhotoCache, RefusesADatabaseOfAnotherProgramAndLeavesItAsItWas) {
  const TemporaryFolder folder;
  changeDatabase(folder / "other.db", "CREATE TABLE photos (id INTEGER)");
  const Bytes before = folder.read("other.db");
  EXPECT_THAT(refusalOf(folder / "other.db"), HasSubstr("is not a cache of photos"));
  EXPECT_EQ(folder.read("other.db"), before);
}

TEST(PhotoCache, RefusesACacheOfAnotherLayout) {
  const TemporaryFolder folder;
  { const PhotoCache cache(folder / "cache"); }
  for (const int layout : {1, 99}) {
    changeDatabase(folder / "cache", "PRAGMA user_version = " + std::to_string(layout));
    EXPECT_THAT(refusalOf(folder / "cache"), HasSubstr("another version"));
  }
}

TEST(PhotoCache, ThatIsDamagedGivesAnErrorOrWhatWasStored) {
  const TemporaryFolder folder;
  {
    PhotoCache cache(folder / "cache");
    for (int i = 0; i < 20; ++i) {
      cache.store("/photo " + std::to_string(i), stamp, 8, recordOf(i));
      cache.storeScore("/photo " + std::to_string(i), stamp, 4.0f + i / 7.0f);
    }
  }
  const Bytes whole = folder.read("cache");
  int refused = 0;
  const auto check = [&](const Bytes& bytes, const std::string& what) {
    folder.write("copy", bytes);
    try {
      PhotoCache cache(folder / "copy");
      for (int i = 0; i < 20; ++i) {
        const auto record = cache.find("/photo " + std::to_string(i), stamp, 8);
        if (record) expectSame(record, recordOf(i));
        const auto score = cache.findScore("/photo " + std::to_string(i), stamp);
        EXPECT_EQ(score.value_or(4.0f + i / 7.0f), 4.0f + i / 7.0f) << what;
      }
    } catch (const CacheError& error) {
      ++refused;
      EXPECT_THAT(error.what(), HasSubstr("delete the file or name another one")) << what;
    }
  };
  for (std::size_t size = 1; size < whole.size(); size += 997) {
    check(Bytes(whole.begin(), whole.begin() + size), "cut at " + std::to_string(size));
  }
  for (std::size_t at = 100; at < whole.size(); at += 131) {
    Bytes bytes = whole;
    bytes[at] ^= 0x55;
    check(bytes, "flipped " + std::to_string(at));
  }
  EXPECT_GT(refused, 20);
}

TEST(PhotoCache, InAFolderThatIsNotThereSaysSo) {
  const TemporaryFolder folder;
  EXPECT_THAT(refusalOf(folder / "missing/cache"), HasSubstr("check the path"));
}

TEST(PhotoCache, ServesSeveralRunsAtOnce) {
  const TemporaryFolder folder;
  constexpr int rounds = 10, runs = 4, photos = 20;
  for (int round = 0; round < rounds; ++round) {
    const std::string file = folder / ("cache" + std::to_string(round));
    std::vector<std::string> errors(runs);
    {
      std::vector<std::jthread> threads;
      for (int run = 0; run < runs; ++run) {
        threads.emplace_back([&, run] {
          try {
            PhotoCache cache(file);
            for (int i = 0; i < photos; ++i) {
              const std::string name = std::to_string(run % 2 * photos + i);
              if (!cache.find(name, stamp, 8)) cache.store(name, stamp, 8, recordOf(i));
            }
          } catch (const CacheError& error) {
            errors[run] = error.what();
          }
        });
      }
    }
    ASSERT_THAT(errors, testing::Each(""));
    PhotoCache cache(file);
    for (int i = 0; i < 2 * photos; ++i) {
      expectSame(cache.find(std::to_string(i), stamp, 8), recordOf(i % photos));
    }
  }
}

}  // namespace
}  // namespace pelorin::photo
