#pragma once

// Which sanitizer a file is compiled for, as g++ and clang say it.
#if defined(__has_feature)
#define PELORIN_HAS_FEATURE(name) __has_feature(name)
#else
#define PELORIN_HAS_FEATURE(name) 0
#endif
#if defined(__SANITIZE_ADDRESS__) || PELORIN_HAS_FEATURE(address_sanitizer) || \
    defined(__SANITIZE_THREAD__) || PELORIN_HAS_FEATURE(thread_sanitizer)
#define PELORIN_SANITIZED
#endif

namespace pelorin::test_support {

/// Whether this build runs an order slower than a plain one, under a sanitizer or an emulator. Tests
/// that try all of something try a part of it there; the plain build leaves nothing out.
#if defined(PELORIN_SANITIZED) || defined(__arm__) || defined(__aarch64__)
constexpr bool slowBuild = true;
#else
constexpr bool slowBuild = false;
#endif

}  // namespace pelorin::test_support
