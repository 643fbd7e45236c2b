#pragma once

#include <gtest/gtest.h>

#include <initializer_list>
#include <string>
#include <vector>

#include "tests/jni/support/fake_bitmap.h"
#include "tests/jni/support/fake_environment.h"
#include "tests/jni/support/fake_log.h"

namespace pelorin::test_support {

/// A Java string.
struct FakeString : FakeObject {
  explicit FakeString(const std::string& characters) {
    className = "java/lang/String";
    text = characters;
  }
  operator jstring() { return reinterpret_cast<jstring>(static_cast<FakeObject*>(this)); }
};

/// An array of RectF.
struct FakeFaces : FakeObject {
  struct Rectangle {
    float left, top, right, bottom;
  };
  FakeFaces(std::initializer_list<Rectangle> rectangles);
  void addNull() { elements.push_back(nullptr); }
  operator jobjectArray() { return reinterpret_cast<jobjectArray>(static_cast<FakeObject*>(this)); }

 private:
  std::vector<FakeObject> storage_;
};

/// The six natives as Java calls them, through what was registered.
class Natives {
 public:
  /// Loads the library; the environment must be this thread's.
  static Natives load(FakeEnvironment& env);
  /// Of a library that is loaded already.
  explicit Natives(FakeEnvironment& env) : env_(env) {}

  jlong init(jobject bitmap) const;
  void preprocess(jobjectArray faces, jlong handle) const;
  void apply(jlong handle, jobject bitmap, jstring filter, jstring params) const;
  void release(jlong handle) const;
  bool applyToFile(jstring input, jstring output, jint rotation, jobjectArray faces, jint scale,
                   jstring filter, jstring params) const;
  float similarity(jobject bitmap1, double time1, jint orientation1, jobject bitmap2, double time2,
                   jint orientation2) const;

 private:
  FakeEnvironment& env_;
};

/// Natives in a fake environment; every test ends with a look at what they did to it.
class NativesTest : public testing::Test {
 protected:
  NativesTest();
  ~NativesTest() override;

  FakeEnvironment env;
  Natives natives;
};

/// What the engine itself makes of `photo`.
std::vector<std::uint8_t> engineResult(
    const image_processing::Image<image_processing::RGBA8Pixel>& photo, const std::string& filter,
    const std::string& params);

/// The names of all filters.
std::vector<std::string> filterNames();

/// The bytes of an image.
std::vector<std::uint8_t> bytesOf(
    const image_processing::Image<image_processing::RGBA8Pixel>& image);

}  // namespace pelorin::test_support
