#include "tests/jni/support/whole_run.h"

#include <algorithm>
#include <cstring>

namespace pelorin::test_support {

WholeRun::WholeRun(const Natives& natives) : natives(natives) {
  writePicture(input.text, picture);
}

std::vector<std::uint8_t> WholeRun::results() {
  std::fill(output.bytes.begin(), output.bytes.end(), 0);
  const jlong handle = natives.init(photo.reference());
  natives.preprocess(faces, handle);
  natives.apply(handle, output.reference(), filter, params);
  natives.release(handle);
  EXPECT_TRUE(natives.applyToFile(input, file, 90, faces, 1, filter, params));
  const float score = natives.similarity(photo.reference(), 1, 2, padded.reference(), 3, 4);
  std::vector<std::uint8_t> all(sizeof(score));
  std::memcpy(all.data(), &score, sizeof(score));
  const std::vector<std::uint8_t> pixels = output.packed(), written = contentOf(file.text);
  all.insert(all.end(), pixels.begin(), pixels.end());
  all.insert(all.end(), written.begin(), written.end());
  return all;
}

}  // namespace pelorin::test_support
