#include "photo/selftest.h"

#include <gtest/gtest.h>

#include <fstream>
#include <iterator>

#include "tests/support/instruction_sets.h"

namespace pelorin::photo {
namespace {

std::string recorded() {
  std::ifstream file(TABLE);
  return {std::istreambuf_iterator<char>(file), {}};
}

TEST(Selftest, GivesTheRecordedTableOnEveryInstructionSet) {
  const std::string expected = recorded();
  ASSERT_GT(expected.size(), 1000u);
  test_support::onEveryInstructionSet([&] { EXPECT_EQ(selftestTable(), expected); });
}

}  // namespace
}  // namespace pelorin::photo
