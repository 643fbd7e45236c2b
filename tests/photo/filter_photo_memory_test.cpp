#include <gtest/gtest.h>

#include <memory>
#include <new>
#include <string>

#include "photo/filter_photo.h"
#include "photo/thread_workers.h"
#include "tests/support/allocation_faults.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/slow_build.h"

namespace pelorin::photo {
namespace {

using test_support::AllocationFaults;
using test_support::Bytes;
using test_support::slowBuild;

// Those of the calling thread fail, which is one of the workers as well.
TEST(FilterPhoto, LeavesNothingBehindWhicheverAllocationFails) {
  const Bytes file = test_support::makeJpeg({.width = 40, .height = 50});
  for (const std::string filter : {"AE0", "WinterRGB"}) {
    const FilterRequest request{.filter = filter, .params = filter == "AE0" ? "slider=0.6;" : ""};
    for (const std::size_t threads : {1, 2}) {
      const auto filtered = [&] {
        ThreadWorkers workers(threads);
        return filterPhoto(file, request, nullptr, {.pixels = 0, .workers = &workers}).file;
      };
      const Bytes expected = filtered();
      long allocations = 0, failed = 0;
      {
        const AllocationFaults none(0);
        filtered();
        allocations = none.count();
      }
      for (long n = 1; n <= allocations; n += slowBuild ? 11 : 1) {
        const long before = test_support::blocksInUse();
        try {
          const AllocationFaults faults(n);
          const bool same = filtered() == expected;
          EXPECT_TRUE(same) << n;  // something managed without
        } catch (const std::bad_alloc&) {
          ++failed;
        }
        EXPECT_EQ(test_support::blocksInUse(), before) << filter << ", allocation " << n;
      }
      EXPECT_GT(failed, slowBuild ? 2 : 20);
    }
  }
}

}  // namespace
}  // namespace pelorin::photo
