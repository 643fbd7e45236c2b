#include "photo/metadata/md5.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <vector>

namespace pelorin::photo {
namespace {

TEST(Md5, OfTheSuiteInRfc1321) {
  EXPECT_EQ(md5Hex(""), "D41D8CD98F00B204E9800998ECF8427E");
  EXPECT_EQ(md5Hex("a"), "0CC175B9C0F1B6A831C399E269772661");
  EXPECT_EQ(md5Hex("abc"), "900150983CD24FB0D6963F7D28E17F72");
  EXPECT_EQ(md5Hex("message digest"), "F96B697D7CB7938D525A2F31AAF161D0");
  EXPECT_EQ(md5Hex("abcdefghijklmnopqrstuvwxyz"), "C3FCD3D76192E4007DFB496CCA67E13B");
  EXPECT_EQ(md5Hex("ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789"),
            "D174AB98D277D9F5A5611C2C9F419D9F");
  EXPECT_EQ(md5Hex("1234567890123456789012345678901234567890123456789012345678901234567890123456789"
                   "0"),
            "57EDF4A22BE3C955AC49DA2E2107B67A");
}

TEST(Md5, IsTheSameInWhateverPiecesTheBytesCome) {
  std::vector<std::uint8_t> bytes;
  for (int i = 0; i < 200; ++i) bytes.push_back(static_cast<std::uint8_t>(7 * i));
  for (std::size_t size = 0; size <= bytes.size(); ++size) {
    const std::span<const std::uint8_t> all(bytes.data(), size);
    const std::string whole = md5Hex({reinterpret_cast<const char*>(all.data()), size});
    for (const std::size_t piece : {1, 3, 63, 64, 65}) {
      Md5 sum;
      for (std::size_t at = 0; at < size; at += piece)
        sum.add(all.subspan(at, std::min(piece, size - at)));
      EXPECT_EQ(sum.hex(), whole) << size << " bytes in pieces of " << piece;
    }
  }
}

}  // namespace
}  // namespace pelorin::photo
