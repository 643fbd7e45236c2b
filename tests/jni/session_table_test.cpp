#include "jni/session_table.h"

#include <gtest/gtest.h>

#include <set>
#include <thread>
#include <vector>

#include "tests/jni/support/fake_log.h"
#include "tests/support/pictures.h"

namespace pelorin::quenby {
namespace {

using test_support::flatPicture;
using test_support::takeLogLines;

std::shared_ptr<QuenbySession> newSession() {
  return std::make_shared<QuenbySession>(flatPicture(2, 2, {1, 2, 3, 4}));
}

TEST(SessionTable, KnowsASessionByItsHandle) {
  SessionTable table;
  const auto session = newSession();
  const jlong handle = table.open(session);
  EXPECT_GT(handle, 0);
  EXPECT_EQ(table.find(handle), session);
  EXPECT_EQ(table.size(), 1u);
}

TEST(SessionTable, LogsAnUnknownHandle) {
  takeLogLines();
  SessionTable table;
  EXPECT_EQ(table.find(-12), nullptr);
  table.release(7);
  EXPECT_EQ(takeLogLines(), (std::vector<std::string>{"6 QuenbyLib: no session has the handle -12",
                                                      "6 QuenbyLib: no session has the handle 7"}));
}

TEST(SessionTable, KeepsAReleasedSessionForThoseAtWorkOnIt) {
  SessionTable table;
  const jlong handle = table.open(newSession());
  const auto atWork = table.find(handle);
  table.release(handle);
  EXPECT_EQ(table.find(handle), nullptr);
  EXPECT_EQ(atWork->image->width, 2u);
}

TEST(SessionTable, FreesThePixelsOfAReleasedSession) {
  SessionTable table;
  const jlong handle = table.open(newSession());
  const std::weak_ptr<image_processing::RGBA8Pixel> pixels = table.find(handle)->image->data;
  table.release(handle);
  EXPECT_TRUE(pixels.expired());
}

TEST(SessionTable, GivesNoHandleASecondTime) {
  SessionTable table;
  const jlong stale = table.open(newSession());
  table.release(stale);
  // Its memory serves the next one, as that of a released session may.
  const auto session = newSession();
  jlong previous = stale;
  for (int i = 0; i < 1'000'000; ++i) {
    const jlong handle = table.open(session);
    ASSERT_GT(handle, previous);  // so neither is it any of those before
    if (i % 997 == 0) {
      ASSERT_EQ(table.find(stale), nullptr);
      table.release(stale);
      ASSERT_EQ(table.find(handle), session);
    }
    table.release(handle);
    previous = handle;
  }
  EXPECT_EQ(table.size(), 0u);
  takeLogLines();
}

TEST(SessionTable, SharesItsCountWithEveryOther) {
  SessionTable one, another;
  const jlong first = one.open(newSession()), second = another.open(newSession());
  EXPECT_GT(second, first);
  EXPECT_GT(one.open(newSession()), second);
  EXPECT_EQ(another.find(first), nullptr);
  takeLogLines();
}

TEST(SessionTable, CountsOnAfterEveryReleaseInManyThreads) {
  SessionTable table;
  std::vector<std::vector<jlong>> handles(4);
  std::vector<std::thread> threads;
  for (auto& own : handles) {
    threads.emplace_back([&] {
      for (int i = 0; i < 2000; ++i) {
        own.push_back(table.open(newSession()));
        table.release(own.back());
      }
    });
  }
  for (std::thread& thread : threads) thread.join();
  std::set<jlong> all;
  for (const auto& own : handles) all.insert(own.begin(), own.end());
  EXPECT_EQ(all.size(), 8000u);
}

}  // namespace
}  // namespace pelorin::quenby
