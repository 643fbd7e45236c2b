#include "jni/session_table.h"

#include <gtest/gtest.h>

#include <set>

#include "tests/jni/support/fake_log.h"
#include "tests/support/pictures.h"

namespace pelorin::quenby {
namespace {

using test_support::flatPicture;
using test_support::takeLogLines;

std::shared_ptr<QuenbySession> newSession() {
  return std::make_shared<QuenbySession>(flatPicture(2, 2, {1, 2, 3, 4}));
}

TEST(SessionTable, KnowsASessionByItsAddress) {
  SessionTable table;
  const auto session = newSession();
  const jlong handle = table.open(session);
  EXPECT_EQ(handle, static_cast<jlong>(reinterpret_cast<std::uintptr_t>(session.get())));
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

TEST(SessionTable, GivesNoHandleASecondTimeSoonAfterItsRelease) {
  SessionTable table;
  std::set<jlong> handles;
  for (int i = 0; i < 256; ++i) {
    const jlong handle = table.open(newSession());
    EXPECT_TRUE(handles.insert(handle).second);
    table.release(handle);
  }
}

}  // namespace
}  // namespace pelorin::quenby
