#include <dlfcn.h>
#include <gtest/gtest.h>
#include <hwy/highway.h>

#include <cstdint>

namespace {

TEST(InstructionSets, AreThoseThatHighwaysLibraryFinds) {
  void* const library = dlopen("libhwy.so.1", RTLD_NOW | RTLD_LOCAL);
  if (library == nullptr) GTEST_SKIP() << "Highway's library is not installed: " << dlerror();
  const auto supportedTargets =
      reinterpret_cast<std::int64_t (*)()>(dlsym(library, "_ZN3hwy16SupportedTargetsEv"));
  ASSERT_NE(supportedTargets, nullptr) << dlerror();
  ASSERT_NE(supportedTargets, &hwy::SupportedTargets) << "Highway's library is linked";
  // The library may know more sets than its headers compile for.
  EXPECT_EQ(hwy::SupportedTargets() & HWY_TARGETS, supportedTargets() & HWY_TARGETS);
  dlclose(library);
}

TEST(InstructionSets, AreThoseOfATestUntilItTakesThemBack) {
  const std::int64_t found = hwy::SupportedTargets();
  hwy::SetSupportedTargetsForTest(HWY_STATIC_TARGET);
  EXPECT_EQ(hwy::SupportedTargets(), HWY_STATIC_TARGET);
  EXPECT_FALSE(hwy::GetChosenTarget().IsInitialized());
  hwy::SetSupportedTargetsForTest(0);
  EXPECT_EQ(hwy::SupportedTargets(), found);
}

}  // namespace
