#pragma once

#include <cstdint>
#include <vector>

#include "tests/jni/support/natives_fixture.h"
#include "tests/jni/support/picture_files.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {

/// Everything the six natives need, made once, so that a run of theirs can be repeated under
/// faults.
struct WholeRun {
  explicit WholeRun(const Natives& natives);

  const Natives& natives;
  const Image<RGBA8Pixel> picture = photoLikePicture(40, 30, 5);
  FakeBitmap photo{picture}, output{40, 30}, padded{picture, 4};
  FakeFaces faces{{0.2f, 0.2f, 0.6f, 0.7f}, {0.1f, 0.5f, 0.3f, 0.9f}, {0.7f, 0.1f, 0.9f, 0.4f}};
  FakeString filter{"AE0"}, params{"slider=0.4;gtmOnly=false;gtmExtraMemory=false;"};
  TemporaryFolder folder;
  FakeString input{folder / "in.jpg"}, file{folder / "out.jpg"};

  /// A whole life of a session and the other two natives, and what they made: the score's bytes,
  /// the bitmap's pixels and the file.
  std::vector<std::uint8_t> results();
};

}  // namespace pelorin::test_support
