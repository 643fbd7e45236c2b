// Every kernel beside its definition, byte for byte: the least that is asked of one. What is more
// particular to a kernel, its own test asks.
#include "tests/kernels/kernels.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <cstdint>
#include <set>
#include <utility>

#include "tests/support/instruction_sets.h"
#include "tests/support/slow_build.h"

namespace pelorin::test_support {

void PrintTo(const KernelRow& row, std::ostream* stream) {
  *stream << row.name;
}

namespace {

using Bytes = std::vector<std::byte>;

Bytes writtenBy(const std::function<void()>& run, const Kernel& kernel) {
  const auto before = kernel.written();
  std::fill(before.begin(), before.end(), std::byte{0xA5});
  run();
  const auto after = kernel.written();
  return Bytes(after.begin(), after.end());
}

class KernelOf : public testing::TestWithParam<KernelRow> {};

void expectTheDefinition(const KernelRow& row, PictureKind kind, std::uint32_t width,
                         std::uint32_t height) {
  const Kernel kernel = row.on(pictureOf(kind, width, height));
  const Bytes expected = writtenBy(kernel.definition, kernel);
  for (const std::int64_t set : instructionSets(HWY_AVX3_DL)) {
    const UseInstructionSet use(set);
    ASSERT_EQ(writtenBy(kernel.vectors, kernel), expected)
        << nameOf(kind) << ", " << width << " x " << height << " on " << hwy::TargetName(set);
  }
}

TEST_P(KernelOf, VectorsIsItsDefinitionOnEveryInstructionSet) {
  const KernelRow& row = GetParam();
  // Every tail of a 64-lane vector. A picture has rows behind each tail.
  for (std::uint32_t width = 1; width <= (slowBuild ? 70 : 130); ++width) {
    expectTheDefinition(row, PictureKind::photo, width, row.shape == Shape::row ? 1 : 3);
  }
  std::vector<PictureKind> kinds = row.otherPictures;
  kinds.push_back(PictureKind::photo);
  for (const PictureKind kind : kinds) {
    for (const auto& [width, height] :
         {std::pair{1u, 1u}, {1u, 90u}, {7u, 7u}, {33u, 32u}, {97u, 61u}, {203u, 197u}}) {
      expectTheDefinition(row, kind, width, height);
    }
  }
  if (row.shape == Shape::row) expectTheDefinition(row, PictureKind::photo, 0, 0);
}

std::vector<KernelRow> rowsWithADefinition() {
  std::vector<KernelRow> rows = kernelRows();
  std::erase_if(rows, [](const KernelRow& row) { return row.shape == Shape::step; });
  return rows;
}

INSTANTIATE_TEST_SUITE_P(Every, KernelOf, testing::ValuesIn(rowsWithADefinition()),
                         [](const auto& test) {
                           std::string name = test.param.name;
                           std::replace_if(
                               name.begin(), name.end(),
                               [](unsigned char c) { return std::isalnum(c) == 0; }, '_');
                           return name;
                         });

TEST(KernelRows, HaveNamesOfTheirOwnWithoutBlanks) {
  std::set<std::string> names;
  for (const KernelRow& row : kernelRows()) {
    EXPECT_TRUE(names.insert(row.name).second) << row.name;
    EXPECT_EQ(row.name.find(' '), std::string::npos) << row.name;
  }
}

}  // namespace
}  // namespace pelorin::test_support
