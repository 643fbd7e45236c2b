#pragma once

namespace pelorin::test_support {

/// Whether this build runs an order slower than a plain one, under a sanitizer or an emulator. Tests
/// that try all of something try a part of it there; the plain build leaves nothing out.
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__) || defined(__arm__)
constexpr bool slowBuild = true;
#else
constexpr bool slowBuild = false;
#endif

}  // namespace pelorin::test_support
