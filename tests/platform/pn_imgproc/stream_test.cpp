#include "platform/pn_imgproc/stream.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <filesystem>
#include <stdexcept>
#include <system_error>

#include "photo/file_io.h"
#include "platform/pn_imgproc/native_image_processor.h"
#include "platform/pnjni/environment.h"
#include "tests/jni/support/natives_fixture.h"
#include "tests/jni/support/picture_files.h"

namespace pelorin::imgproc {
namespace {

using test_support::contentOf;
using test_support::FakeEnvironment;
using test_support::FakeString;
using test_support::TemporaryFolder;
using testing::ElementsAre;
using testing::StartsWith;

class StreamTest : public testing::Test {
 protected:
  StreamTest() {
    jni::initialize(FakeEnvironment::machine(), [] {});
    photo::writeFileAtomically(output.text, old);
  }
  ~StreamTest() override {
    EXPECT_EQ(env.takeException(), "");
    EXPECT_EQ(env.violations(), "");
  }

  void encodeInto(Stream& out) {
    const std::uint8_t pixel[4] = {1, 2, 3, 255};
    NativeImageProcessor::encodeJpeg(&env, pixel, 1, 1, ColorSpace::RGBA_8888, 90, out);
  }

  FakeEnvironment env;
  TemporaryFolder folder;
  FakeString output{folder / "out.jpg"};
  const std::vector<std::uint8_t> old = {1, 2, 3};
};

TEST_F(StreamTest, IsClosedWhenItIsDestroyed) {
  {
    Stream out(&env, output, "w");
    encodeInto(out);
    EXPECT_EQ(contentOf(output.text), old);
  }
  EXPECT_EQ(contentOf(output.text).size(), 12u);
  EXPECT_THAT(folder.content(), ElementsAre("out.jpg"));
}

TEST_F(StreamTest, LeavesTheFileWhenNothingWasWrittenToTheEnd) {
  { const Stream out(&env, output, "w"); }
  EXPECT_EQ(contentOf(output.text), old);
  try {
    Stream out(&env, output, "w");
    NativeImageProcessor::encodeJpeg(&env, nullptr, 0, 0, ColorSpace::RGBA_8888, 90, out);
    FAIL() << "a picture without pixels";
  } catch (const std::runtime_error&) {
  }
  EXPECT_EQ(contentOf(output.text), old);
  EXPECT_THAT(folder.content(), ElementsAre("out.jpg"));
}

TEST_F(StreamTest, LeavesAnIOExceptionPendingWhenItCannotBeClosed) {
  {
    Stream out(&env, output, "w");
    encodeInto(out);
    std::filesystem::remove(output.text);
    std::filesystem::create_directory(output.text);
  }
  EXPECT_THAT(env.takeException(), StartsWith("java/io/IOException: " + output.text));
  EXPECT_THAT(folder.content(), ElementsAre("out.jpg/"));
}

TEST_F(StreamTest, LeavesAnEarlierExceptionPendingWhenItCannotBeClosed) {
  {
    Stream out(&env, output, "w");
    encodeInto(out);
    std::filesystem::remove(output.text);
    std::filesystem::create_directory(output.text);
    env.raise("test/First", "cause");
  }
  EXPECT_EQ(env.takeException(), "test/First: cause");
}

TEST_F(StreamTest, ThrowsWhenItsFileCannotBeWritten) {
  FakeString nowhere(folder / "no such folder/out.jpg");
  Stream out(&env, nowhere, "w");
  EXPECT_THROW(encodeInto(out), std::system_error);
}

TEST_F(StreamTest, RefusesANullPathAndAnotherMode) {
  EXPECT_THROW(Stream(&env, nullptr, "r"), std::invalid_argument);
  EXPECT_THROW(Stream(&env, output, "rw"), std::invalid_argument);
  FakeString missing(folder / "missing.jpg");
  EXPECT_THROW(Stream(&env, missing, "r"), std::system_error);
}

}  // namespace
}  // namespace pelorin::imgproc
