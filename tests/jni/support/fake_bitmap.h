#pragma once

#include <android/bitmap.h>

#include <atomic>
#include <cstdint>
#include <vector>

#include "image_processing/core/image.h"
#include "tests/jni/support/fake_environment.h"

namespace pelorin::test_support {

/// A bitmap of the double of the bitmap library, which counts what it does.
struct FakeBitmap : FakeObject {
  /// Of RGBA pixels, `padding` bytes of 0xEE after each row.
  FakeBitmap(std::uint32_t width, std::uint32_t height, std::uint32_t padding = 0);
  explicit FakeBitmap(const image_processing::Image<image_processing::RGBA8Pixel>& image,
                      std::uint32_t padding = 0);

  jobject reference() { return reinterpret_cast<jobject>(static_cast<FakeObject*>(this)); }
  /// The pixels without padding.
  std::vector<std::uint8_t> packed() const;

  AndroidBitmapInfo info;
  std::vector<std::uint8_t> bytes;
  std::atomic<int> locks = 0, timesLocked = 0;
  int infoResult = 0, lockResult = 0;  ///< What the library answers.
  std::uint32_t heightOnceLocked = 0;  ///< Another, if not 0: as if a thread had come in between.
};

}  // namespace pelorin::test_support
