// Every kernel and its definition once more, for the memory sanitizer. Without GoogleTest, whose streams are the
// C++ library's own code: what others compiled counts as never written.
#include <sanitizer/msan_interface.h>

#include <algorithm>
#include <cstddef>
#include <cstdio>
#include <functional>
#include <utility>
#include <vector>

#include "tests/kernels/kernels.h"

int main() {
  using namespace pelorin::test_support;
  for (const KernelRow& row : kernelRows()) {
    for (const auto& [width, height] : {std::pair{1u, 1u}, {7u, 7u}, {33u, 32u}, {97u, 61u}}) {
      if (row.shape == Shape::step) continue;
      const Kernel kernel = row.on(pictureOf(PictureKind::photo, width, height));
      const auto bytesOf = [&](const std::function<void()>& run) {
        const auto before = kernel.written();  // with room behind it, which nobody writes
        std::fill(before.begin(), before.end(), std::byte{0xA5});
        run();
        const auto bytes = kernel.written();
        __msan_check_mem_is_initialized(bytes.data(), bytes.size());
        return std::vector<std::byte>(bytes.begin(), bytes.end());
      };
      if (bytesOf(kernel.vectors) != bytesOf(kernel.definition))
        return std::printf("%s differs\n", row.name.c_str()), 1;
    }
    std::printf("%s\n", row.name.c_str());
  }
}
