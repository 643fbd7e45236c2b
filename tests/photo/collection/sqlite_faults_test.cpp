#include <dlfcn.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sqlite3.h>

#include <cstdio>
#include <filesystem>
#include <functional>
#include <optional>
#include <string>
#include <type_traits>
#include <utility>

#include "photo/collection/ledger.h"
#include "photo/collection/photo_cache.h"
#include "tests/support/temporary_folder.h"

// What the library calls of SQLite is seen here first: this program's functions come before those of
// SQLite, and one of them fails, or one and all after it.
namespace {

struct {
  long failing = 0;  // 0: none
  int code = 0;
  bool later = false;
  long count = 0;
} plan;

// SQLite calls some of its functions itself, which then are none of the library's calls.
bool isInside = false;

bool fails() {
  if (isInside) return false;
  ++plan.count;
  return plan.failing > 0 &&
         (plan.count == plan.failing || (plan.later && plan.count > plan.failing));
}

template <typename Result, typename... Parameters>
Result next(Result (*)(Parameters...), const char* name,
            std::type_identity_t<Parameters>... given) {
  const bool before = std::exchange(isInside, true);
  const Result result =
      reinterpret_cast<Result (*)(Parameters...)>(dlsym(RTLD_NEXT, name))(given...);
  isInside = before;
  return result;
}

}  // namespace

// Seen by libraries, too.
#pragma GCC visibility push(default)
#define NEXT(name, ...) next(&name, #name, __VA_ARGS__)

extern "C" {

// Nothing here asks for what a disk has after a power cut.
int fsync(int) {
  return 0;
}
int fdatasync(int) {
  return 0;
}

int sqlite3_open_v2(const char* file, sqlite3** database, int flags, const char* system) {
  *database = nullptr;
  return fails() ? plan.code : NEXT(sqlite3_open_v2, file, database, flags, system);
}
int sqlite3_busy_timeout(sqlite3* database, int milliseconds) {
  return fails() ? plan.code : NEXT(sqlite3_busy_timeout, database, milliseconds);
}
int sqlite3_exec(sqlite3* database, const char* sql, int (*row)(void*, int, char**, char**),
                 void* argument, char** error) {
  return fails() ? plan.code : NEXT(sqlite3_exec, database, sql, row, argument, error);
}
int sqlite3_prepare_v2(sqlite3* database, const char* sql, int size, sqlite3_stmt** statement,
                       const char** tail) {
  *statement = nullptr;
  return fails() ? plan.code : NEXT(sqlite3_prepare_v2, database, sql, size, statement, tail);
}
int sqlite3_step(sqlite3_stmt* statement) {
  return fails() ? plan.code : NEXT(sqlite3_step, statement);
}
int sqlite3_bind_blob(sqlite3_stmt* statement, int place, const void* value, int size,
                      void (*release)(void*)) {
  return fails() ? plan.code : NEXT(sqlite3_bind_blob, statement, place, value, size, release);
}
int sqlite3_bind_blob64(sqlite3_stmt* statement, int place, const void* value, sqlite3_uint64 size,
                        void (*release)(void*)) {
  return fails() ? plan.code : NEXT(sqlite3_bind_blob64, statement, place, value, size, release);
}
int sqlite3_bind_text(sqlite3_stmt* statement, int place, const char* value, int size,
                      void (*release)(void*)) {
  return fails() ? plan.code : NEXT(sqlite3_bind_text, statement, place, value, size, release);
}
int sqlite3_bind_int(sqlite3_stmt* statement, int place, int value) {
  return fails() ? plan.code : NEXT(sqlite3_bind_int, statement, place, value);
}
int sqlite3_bind_int64(sqlite3_stmt* statement, int place, sqlite3_int64 value) {
  return fails() ? plan.code : NEXT(sqlite3_bind_int64, statement, place, value);
}
int sqlite3_bind_double(sqlite3_stmt* statement, int place, double value) {
  return fails() ? plan.code : NEXT(sqlite3_bind_double, statement, place, value);
}
const void* sqlite3_column_blob(sqlite3_stmt* statement, int column) {
  return fails() ? nullptr : NEXT(sqlite3_column_blob, statement, column);
}
const unsigned char* sqlite3_column_text(sqlite3_stmt* statement, int column) {
  return fails() ? nullptr : NEXT(sqlite3_column_text, statement, column);
}
}

#pragma GCC visibility pop

namespace pelorin::photo {
namespace {

using test_support::Bytes;
using test_support::TemporaryFolder;

constexpr FileStamp stamp = {1000, 1'700'000'000'123'456'789};

PhotoRecord recordOf(std::uint32_t width) {
  image_processing::GreenCDF cdf;
  for (std::size_t i = 0; i < cdf.size(); ++i) cdf[i] = static_cast<float>(i + 1) / 256;
  return {width,
          3000,
          6,
          CaptureTime{"2024-05-01T12:00:00.5+02:00", 1714557600.5, true, 7200},
          {cdf, countedPixels(width, 3000, 8)}};
}

// What is in a cache of the two.
void expectRecord(PhotoCache& cache, const std::string& photo, std::uint32_t width, bool mayMiss) {
  const std::optional<PhotoRecord> found = cache.find(photo, stamp, 8);
  if (mayMiss && !found) return;
  const PhotoRecord expected = recordOf(width);
  ASSERT_TRUE(found.has_value()) << photo;
  EXPECT_EQ(found->width, width);
  EXPECT_EQ(found->cdf.unpacked(), expected.cdf.unpacked());
  ASSERT_TRUE(found->captureTime.has_value());
  EXPECT_EQ(found->captureTime->text, expected.captureTime->text);
  EXPECT_EQ(found->captureTime->zoneSeconds, 7200);
}

class SqliteFaults : public testing::Test {
 protected:
  ~SqliteFaults() override { plan = {}; }

  /// Runs `work` on a fresh copy of a database, made by `make`, once for each call, each of `codes`, alone and
  /// with all calls after it; `check` looks at what is left.
  void failEachCall(const std::function<void(const std::string& file)>& make,
                    const std::function<void(const std::string& file)>& work,
                    const std::function<void(const std::string& file, int code)>& check) {
    make(folder / "made");
    const Bytes made = folder.read("made");
    const std::string file = folder / "file";
    long faults = 0;
    for (const int code : {SQLITE_NOMEM, SQLITE_IOERR, SQLITE_FULL, SQLITE_BUSY, SQLITE_READONLY}) {
      for (const bool later : {false, true}) {
        for (long failing = 1;; ++failing) {
          SCOPED_TRACE("call " + std::to_string(failing) + ", code " + std::to_string(code) +
                       (later ? ", and all later ones" : ""));
          folder.write("file", made);
          const sqlite3_int64 memory = sqlite3_memory_used();
          plan = {failing, code, later};
          work(file);
          const bool reached = plan.count >= failing;
          plan = {};
          EXPECT_EQ(sqlite3_memory_used(), memory) << "leaked";
          check(file, code);
          if (HasFailure()) return;
          std::filesystem::remove(file);
          EXPECT_EQ(folder.content(), std::set<std::string>{"made"});
          if (!reached) break;
          ++faults;
        }
      }
    }
    EXPECT_GE(faults, least);
    printf("%ld failing calls of SQLite\n", faults);
  }

  const TemporaryFolder folder;
  long least = 0;  // that were tried when this was written, some fewer
};

TEST_F(SqliteFaults, OfACacheAreErrorsAndLoseNothing) {
  least = 600;
  failEachCall(
      [](const std::string& file) {
        PhotoCache cache(file);
        cache.store("a.jpg", stamp, 8, recordOf(4000));
        cache.storeScore("a.jpg", stamp, 3.5f);
      },
      [](const std::string& file) {
        try {
          PhotoCache cache(file);
          for (const auto& step : std::initializer_list<std::function<void()>>{
                   [&] { expectRecord(cache, "a.jpg", 4000, false); },
                   [&] { cache.store("b.jpg", stamp, 8, recordOf(5000)); },
                   [&] { cache.store("a.jpg", stamp, 8, recordOf(6000)); },
                   [&] { EXPECT_EQ(cache.findScore("a.jpg", stamp), 3.5f); },
                   [&] { cache.storeScore("b.jpg", stamp, 4.5f); }}) {
            try {  // as a run goes on that does not want to end for its cache
              step();
            } catch (const CacheError& error) {
              EXPECT_THAT(error.what(), testing::HasSubstr(file));
              EXPECT_THAT(error.what(), testing::Not(testing::HasSubstr("damaged")));
            }
          }
        } catch (const CacheError& error) {
          EXPECT_THAT(error.what(), testing::HasSubstr(file));
          EXPECT_THAT(error.what(), testing::Not(testing::HasSubstr("damaged")));
        }
      },
      [](const std::string& file, int) {
        PhotoCache cache(file);
        const std::optional<PhotoRecord> first = cache.find("a.jpg", stamp, 8);
        ASSERT_TRUE(first.has_value());
        EXPECT_TRUE(first->width == 4000 || first->width == 6000);
        expectRecord(cache, "a.jpg", first->width, false);
        expectRecord(cache, "b.jpg", 5000, true);
        EXPECT_EQ(cache.findScore("a.jpg", stamp), 3.5f);
        EXPECT_EQ(cache.findScore("b.jpg", stamp).value_or(4.5f), 4.5f);
        cache.store("b.jpg", stamp, 8, recordOf(7000));
        expectRecord(cache, "b.jpg", 7000, false);
      });
}

TEST_F(SqliteFaults, OfANewCacheLeaveOneThatCanBeMade) {
  least = 330;
  failEachCall([](const std::string& file) { std::fclose(std::fopen(file.c_str(), "w")); },
               [](const std::string& file) {
                 try {
                   PhotoCache cache(file);
                   cache.store("a.jpg", stamp, 8, recordOf(4000));
                 } catch (const CacheError& error) {
                   EXPECT_THAT(error.what(), testing::Not(testing::HasSubstr("damaged")));
                 }
               },
               [](const std::string& file, int) {
                 PhotoCache cache(file);
                 expectRecord(cache, "a.jpg", 4000, true);
                 cache.store("a.jpg", stamp, 8, recordOf(5000));
                 expectRecord(cache, "a.jpg", 5000, false);
               });
}

const LedgerEntry done = {{1000, 7}, "out/a.jpg", FileStamp{7, -5}, false};
const LedgerEntry begun = {{1, 2}, "out/b.jpg", {}, true};
const LedgerEntry changed = {{3000, 9}, "out/a.jpg", FileStamp{8, 5}, false};

TEST_F(SqliteFaults, OfALedgerAreToldAndLoseNothing) {
  least = 370;
  failEachCall(
      [](const std::string& file) {
        Ledger ledger(file);
        ledger.put({{"a", done}, {"c", done}});
      },
      [](const std::string& file) {
        try {
          Ledger ledger(file);
          ledger.put({{"a", changed}, {"b", begun}});
          // Whatever fails, this process knows what it has done.
          ASSERT_NE(ledger.find("b"), nullptr);
          EXPECT_EQ(*ledger.find("a"), changed);
          EXPECT_EQ(*ledger.find("b"), begun);
          const std::string trouble = ledger.takeTrouble();
          const bool failed = plan.count >= plan.failing;
          EXPECT_EQ(trouble.empty(), !failed) << trouble;
        } catch (const LedgerInUse&) {
          EXPECT_EQ(plan.code, SQLITE_BUSY);
        }
      },
      [](const std::string& file, int) {
        Ledger ledger(file);
        EXPECT_EQ(ledger.takeTrouble(), "");
        ASSERT_NE(ledger.find("a"), nullptr);
        ASSERT_NE(ledger.find("c"), nullptr);
        EXPECT_EQ(*ledger.find("c"), done);
        const bool isNew = ledger.find("b") != nullptr;  // both or none
        EXPECT_EQ(*ledger.find("a"), isNew ? changed : done);
        if (isNew) {
          EXPECT_EQ(*ledger.find("b"), begun);
        }
        ledger.put("b", begun);
        EXPECT_EQ(ledger.takeTrouble(), "");
      });
}

}  // namespace
}  // namespace pelorin::photo
