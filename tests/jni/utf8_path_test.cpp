#include "platform/pn_imgproc/utf8_path.h"

#include <gtest/gtest.h>

#include <stdexcept>

namespace pelorin::imgproc {
namespace {

TEST(Utf8Path, KeepsTheBasicPlane) {
  for (const char* path : {"", "/a/b.jpg", "/na\xC3\xAFve/\xE5\x86\x99.jpg", "\xED\x9F\xBF"})
    EXPECT_EQ(utf8Path(path), path);
}

TEST(Utf8Path, JoinsSurrogates) {
  EXPECT_EQ(utf8Path("a\xED\xA0\xBD\xED\xB3\xB7z"), "a\xF0\x9F\x93\xB7z");
  EXPECT_EQ(utf8Path("\xED\xA0\x80\xED\xB0\x80"), "\xF0\x90\x80\x80");  // the first
  EXPECT_EQ(utf8Path("\xED\xAF\xBF\xED\xBF\xBF"), "\xF4\x8F\xBF\xBF");  // the last
}

TEST(Utf8Path, KeepsALonelySurrogate) {
  for (const char* path : {"\xED\xA0\xBD", "\xED\xB3\xB7z", "\xED\xA0\xBD\xED\xA0\xBD", "\xED\xA0"})
    EXPECT_EQ(utf8Path(path), path);
}

TEST(Utf8Path, RefusesTheNulCharacter) {
  EXPECT_THROW(utf8Path("photo.jpg\xC0\x80.txt"), std::invalid_argument);
}

}  // namespace
}  // namespace pelorin::imgproc
