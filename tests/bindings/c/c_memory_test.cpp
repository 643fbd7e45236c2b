// Every allocation of the library fails once, alone and with all later ones: the call says that memory ran out,
// leaves nothing behind, and does the next time what it always did.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <functional>
#include <string>
#include <vector>

#include "quenby/quenby.h"
#include "tests/support/allocation_faults.h"

extern "C" {
#include "tests/bindings/c/checks.h"
}

namespace pelorin::test_support {
namespace {

using Later = AllocationFaults::Later;

struct Call {
  std::string name;
  /// Makes the call, frees what it made, and gives its kind; what it made goes into the bytes. Nothing else
  /// is allocated.
  std::function<std::int32_t(std::vector<std::uint8_t>& made)> run;
};

void keep(std::vector<std::uint8_t>& made, const void* bytes, std::size_t size) {
  const auto* const first = static_cast<const std::uint8_t*>(bytes);
  made.assign(first, first + size);  // within what is reserved
}

std::int32_t taken(std::int32_t kind, quenby_file* file, std::vector<std::uint8_t>& made) {
  if (kind == QUENBY_OK) keep(made, quenby_file_data(file), quenby_file_size(file));
  quenby_file_free(file);
  return kind;
}

class CMemory : public testing::Test {
 protected:
  ~CMemory() override {
    std::free(photo.data);
    free_pixels(&pixels);
  }

  void failEachAllocation(const Call& call) {
    std::vector<std::uint8_t> expected, made;
    for (std::vector<std::uint8_t>* const bytes : {&expected, &made}) bytes->reserve(1 << 20);
    ASSERT_EQ(call.run(expected), QUENBY_OK) << error.message;  // and makes what lives on
    long faults = 0, unnoticed = 0;
    for (const Later later : {Later::succeed, Later::fail}) {
      for (long failing = 1;; ++failing) {
        const long blocks = blocksInUse();
        std::int32_t kind;
        long count;
        {
          const AllocationFaults fault(failing, later);
          kind = call.run(made);
          count = fault.count();
        }
        ASSERT_EQ(blocksInUse(), blocks) << "leaked at allocation " << failing;
        if (kind == QUENBY_OK) {
          ASSERT_EQ(made, expected) << failing;
        } else {
          ASSERT_EQ(kind, QUENBY_OUT_OF_MEMORY) << failing << ": " << error.message;
          ASSERT_EQ(error.kind, kind);
          ASSERT_NE(error.message[0], 0);
        }
        if (count < failing) {
          ASSERT_EQ(kind, QUENBY_OK);
          break;
        }
        ++faults;
        unnoticed += kind == QUENBY_OK ? 1 : 0;
      }
    }
    EXPECT_GT(faults, 0);
    EXPECT_LT(unnoticed, faults);
    ASSERT_EQ(call.run(made), QUENBY_OK);
    EXPECT_EQ(made, expected);
    std::printf("%ld injected faults, %ld of them made up for: %s\n", faults, unnoticed,
                call.name.c_str());
  }

  bytes photo = made_photo(64, 48, 1);
  quenby_pixels pixels = made_pixels(64, 48, 1);
};

TEST_F(CMemory, ThatRunsOutIsSaidAndLeavesNothing) {
  static std::uint8_t rgba[64 * 48 * 4];
  const quenby_face faces[3] = {
      {0.1f, 0.1f, 0.5f, 0.5f, 0}, {0.3f, 0.3f, 0.9f, 0.9f, 0}, {10, 10, 40, 30, 1}};
  const auto filterFile = [&](const char* filter, const char* params, std::size_t count) {
    return [=, this](std::vector<std::uint8_t>& made) {
      quenby_file* file = nullptr;
      const std::int32_t kind =
          quenby_filter_file(photo.data, photo.size, filter, params, faces, count, nullptr, nullptr,
                             nullptr, nullptr, &file, &error);
      return taken(kind, file, made);
    };
  };
  const Call calls[] = {
      {"quenby_filter_file", filterFile("AE0", "slider=0.4;", 0)},
      {"quenby_filter_file, 3 faces", filterFile("AE0", "slider=0.4;", 3)},
      {"quenby_filter_file, a look", filterFile("WinterRGB", "", 0)},
      {"quenby_photo_open, quenby_photo_save",
       [&](std::vector<std::uint8_t>& made) {
         quenby_photo* opened = nullptr;
         quenby_file* file = nullptr;
         std::int32_t kind =
             quenby_photo_open(photo.data, photo.size, nullptr, nullptr, &opened, &error);
         if (kind == QUENBY_OK) {
           kind = quenby_photo_save(opened, nullptr, "PNG", nullptr, nullptr, &file, &error);
         }
         quenby_photo_free(opened);
         return taken(kind, file, made);
       }},
      {"quenby_session_open, quenby_session_apply",
       [&](std::vector<std::uint8_t>& made) {
         quenby_session* session = nullptr;
         std::int32_t kind = quenby_session_open(&pixels, faces, 3, 0, &session, &error);
         for (int i = 0; i < 2 && kind == QUENBY_OK; ++i) {
           kind =
               quenby_session_apply(session, "AE0", "slider=0.7;", rgba, 64 * 4, nullptr, &error);
         }
         quenby_session_free(session);
         if (kind == QUENBY_OK) keep(made, rgba, sizeof(rgba));
         return kind;
       }},
      {"quenby_read_shot",
       [&](std::vector<std::uint8_t>& made) {
         static quenby_shot shot;
         const std::int32_t kind =
             quenby_read_shot(photo.data, photo.size, nullptr, nullptr, &shot, &error);
         if (kind == QUENBY_OK) keep(made, &shot, sizeof(shot));
         return kind;
       }},
      {"quenby_fast, quenby_brief",
       [&](std::vector<std::uint8_t>& made) {
         const quenby_grey grey = {pixels.rgba, 64, 48, 64};
         quenby_corners corners{};
         quenby_descriptors found{};
         std::int32_t kind = quenby_fast(&grey, 9, 10, 1, &corners, &error);
         if (kind == QUENBY_OK) {
           kind = quenby_brief(&grey, corners.data, corners.count, &found, &error);
         }
         if (kind == QUENBY_OK) keep(made, found.data, found.count * sizeof(*found.data));
         quenby_corners_free(&corners);
         quenby_descriptors_free(&found);
         return kind;
       }},
      {"quenby_check_parameters", [&](std::vector<std::uint8_t>& made) {
         quenby_fault found[4];
         std::size_t count = 0;
         const std::int32_t kind =
             quenby_check_parameters("AE0", "slide=1;slider=x;s1=nan;", found, 4, &count, &error);
         if (kind == QUENBY_OK) keep(made, &count, sizeof(count));
         return kind;
       }}};
  for (const Call& call : calls) {
    SCOPED_TRACE(call.name);
    failEachAllocation(call);
    if (HasFailure()) return;
  }
}

}  // namespace
}  // namespace pelorin::test_support
