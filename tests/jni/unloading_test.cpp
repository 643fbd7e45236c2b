#include <dlfcn.h>
#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <sstream>
#include <string>

#include "tests/jni/support/fake_environment.h"
#include "tests/support/resident_memory.h"
#include "tests/support/slow_build.h"

namespace pelorin::test_support {
namespace {

void unload(void* library) {
  using OnUnload = void (*)(JavaVM*, void*);
  if (const auto notify = reinterpret_cast<OnUnload>(dlsym(library, "JNI_OnUnload")))
    notify(FakeEnvironment::machine(), nullptr);
  dlclose(library);
}

TEST(Libraries, AreGoneOnceTheyAreClosed) {
  std::istringstream files(PELORIN_LIBRARIES);
  int count = 0;
  for (std::string file; std::getline(files, file, ':'); ++count) {
    FakeEnvironment env;
    void* const library = dlopen(file.c_str(), RTLD_NOW);
    ASSERT_NE(library, nullptr) << dlerror();
    EXPECT_NE(dlopen(file.c_str(), RTLD_NOW | RTLD_NOLOAD), nullptr);
    dlclose(library);
    unload(library);
    EXPECT_EQ(dlopen(file.c_str(), RTLD_NOW | RTLD_NOLOAD), nullptr) << file;
  }
  EXPECT_GE(count, 5);
}

// QUENBY_CYCLES says how often; ./quenby harden sets it.
TEST(Libraries, LeaveMemoryWhereItWas) {
  const char* const wished = std::getenv("QUENBY_CYCLES");
  const int cycles = wished != nullptr ? std::atoi(wished) : 5;
  const auto loadAndUnload = [](int times) {
    for (int i = 0; i < times; ++i) {
      std::istringstream files(PELORIN_LIBRARIES);
      for (std::string file; std::getline(files, file, ':');) {
        FakeEnvironment env;
        void* const library = dlopen(file.c_str(), RTLD_NOW);
        ASSERT_NE(library, nullptr) << dlerror();
        unload(library);
      }
    }
  };
  loadAndUnload(3 + cycles / 10);
  const long before = residentMemory();
  loadAndUnload(cycles);
  const long grown = residentMemory() - before;
  std::printf("%d times loaded and unloaded: %ld bytes grown\n", cycles, grown);
  if (!slowBuild) {
    EXPECT_LE(grown, 64 << 10);
  }
}

}  // namespace
}  // namespace pelorin::test_support
