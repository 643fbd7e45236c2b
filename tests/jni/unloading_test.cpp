#include <dlfcn.h>
#include <gtest/gtest.h>

#include <sstream>
#include <string>

#include "tests/jni/support/fake_environment.h"

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

}  // namespace
}  // namespace pelorin::test_support
