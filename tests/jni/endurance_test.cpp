// What a short test cannot see: sessions by the million, threads by the hour. QUENBY_CYCLES and QUENBY_SECONDS say
// how much; ./quenby harden sets them.
#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <thread>

#include "jni/session_table.h"
#include "tests/jni/support/natives_fixture.h"
#include "tests/support/allocation_faults.h"
#include "tests/support/pictures.h"
#include "tests/support/resident_memory.h"
#include "tests/support/slow_build.h"

namespace pelorin::test_support {
namespace {

double wished(const char* name, double otherwise) {
  const char* const text = std::getenv(name);
  return text != nullptr ? std::atof(text) : otherwise;
}

class Endurance : public NativesTest {
 protected:
  const std::string params = "slider=0.5;s1=0.4;s2=0.6;s3=0.5;s4=0.5;";
  const std::vector<std::string> filters = filterNames();
};

TEST_F(Endurance, SessionsLeaveMemoryWhereItWas) {
  FakeBitmap photo(photoLikePicture(8, 6, 1)), output(8, 6);
  FakeFaces faces{{0.2f, 0.2f, 0.6f, 0.7f}};
  FakeString parameters(params);
  std::vector<std::unique_ptr<FakeString>> names;
  for (const std::string& filter : filters) names.push_back(std::make_unique<FakeString>(filter));
  const auto cycle = [&](long i) {
    const jlong handle = natives.init(photo.reference());
    natives.preprocess(i % 2 != 0 ? static_cast<jobjectArray>(faces) : nullptr, handle);
    natives.apply(handle, output.reference(), *names[i / 2 % names.size()], parameters);
    natives.release(handle);
  };
  const long cycles = static_cast<long>(wished("QUENBY_CYCLES", 1000));
  for (long i = 0; i < 200 + cycles / 10; ++i) cycle(i);
  const long blocks = blocksInUse(), memory = residentMemory();
  for (long i = 0; i < cycles; ++i) cycle(i);
  const long grownBlocks = blocksInUse() - blocks, grown = residentMemory() - memory;
  std::printf("%ld sessions: %ld bytes grown\n", cycles, grown);
  EXPECT_EQ(grownBlocks, 0);
  if (!slowBuild) {
    EXPECT_LE(grown, 64 << 10);
  }
}

TEST_F(Endurance, EveryThreadGetsTheBytesOfItsSerialTwin) {
  constexpr std::size_t threadCount = 8, sessionCount = 8;
  std::vector<std::unique_ptr<FakeBitmap>> photos;
  std::vector<jlong> sessions;
  std::vector<std::vector<std::vector<std::uint8_t>>> twins(sessionCount);
  for (std::size_t s = 0; s < sessionCount; ++s) {
    const auto picture = photoLikePicture(40, 30, static_cast<std::uint32_t>(s));
    photos.push_back(std::make_unique<FakeBitmap>(picture));
    sessions.push_back(natives.init(photos.back()->reference()));
    natives.preprocess(nullptr, sessions.back());
    for (const std::string& filter : filters)
      twins[s].push_back(engineResult(picture, filter, params));
  }
  const auto end =
      std::chrono::steady_clock::now() + std::chrono::duration<double>(wished("QUENBY_SECONDS", 0));
  std::atomic<long> results = 0, others = 0;
  std::vector<std::thread> threads;
  for (std::size_t t = 0; t < threadCount; ++t) {
    threads.emplace_back([&, t] {
      FakeEnvironment env;
      const Natives own(env);
      FakeString parameters(params);
      FakeBitmap output(40, 30);
      std::size_t step = t * 3;
      do {
        for (std::size_t i = 0; i < sessionCount * filters.size(); ++i, ++step) {
          const std::size_t s = step % sessionCount, f = step / sessionCount % filters.size();
          FakeString filter(filters[f]);
          own.apply(sessions[s], output.reference(), filter, parameters);
          ++results;
          if (output.packed() != twins[s][f]) ++others;
        }
      } while (std::chrono::steady_clock::now() < end);
      EXPECT_EQ(env.takeException(), "");
      EXPECT_EQ(env.violations(), "");
    });
  }
  for (std::thread& thread : threads) thread.join();
  for (const jlong session : sessions) natives.release(session);
  std::printf("%ld results of %zu filters\n", results.load(), filters.size());
  EXPECT_EQ(others, 0);
  EXPECT_EQ(quenby::openSessions().size(), 0u);
}

}  // namespace
}  // namespace pelorin::test_support
