// Bytes as a sequence of calls from Java, in a Java environment without Java: whatever they are given and
// whichever of their own calls fail, the natives break none of Java's rules, unlock what they lock, and open and
// close what they say. The environment checks the rules.
#include <cstdint>
#include <cstdlib>
#include <string>
#include <vector>

#include "fuzz/bytes.h"
#include "jni/session_table.h"
#include "tests/jni/support/natives_fixture.h"

using namespace pelorin::test_support;
using pelorin::quenby::openSessions;

namespace {

void check(bool holds) {
  if (!holds) std::abort();
}

std::string wordOf(Bytes& bytes) {
  static const std::vector<std::string> filters = filterNames();
  static const std::string params[] = {"",
                                       "slider=0.4;",
                                       "slider=;",
                                       "slider=nan;",
                                       "=;=",
                                       "slider=1;gtmOnly=true;",
                                       "s1=1e30;s2=-inf;s3=0;s4=1;"};
  const std::uint8_t which = bytes.next();
  if (which < 120) return filters[which % filters.size()];
  if (which < 240) return params[which % std::size(params)];
  std::string any;
  for (int i = which - 240; i > 0; --i) any += static_cast<char>(bytes.next());
  return any;
}

FakeFaces facesOf(Bytes& bytes) {
  const auto side = [&] {
    const std::uint8_t kind = bytes.next();
    return kind < 32 ? bytes.next<float>() : static_cast<float>(kind) / 128.0f - 0.4f;
  };
  const FakeFaces::Rectangle face = {side(), side(), side(), side()};
  FakeFaces faces = bytes.next() % 2 == 0 ? FakeFaces{face} : FakeFaces{face, face};
  if (bytes.next() % 4 == 0) faces.addNull();
  return faces;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  FakeEnvironment env;
  static const Natives* const loaded = new Natives(Natives::load(env));
  (void)loaded;
  const Natives natives(env);
  Bytes bytes(data, size);
  FakeBitmap bitmaps[] = {FakeBitmap(9, 7), FakeBitmap(9, 7, 12), FakeBitmap(4, 20),
                          FakeBitmap(1, 1), FakeBitmap(9, 7)};
  bitmaps[4].info.format = bytes.next();
  for (FakeBitmap& bitmap : bitmaps)
    for (std::uint8_t& byte : bitmap.bytes) byte = static_cast<std::uint8_t>(byte ^ bytes.next());
  std::vector<jlong> handles = {0};
  std::size_t open = openSessions().size();
  for (int i = 0; i < 12 && !bytes.empty(); ++i) {
    const std::uint8_t what = bytes.next();
    const auto failure = (what & 64) != 0 ? FakeEnvironment::Failure::withException
                                          : FakeEnvironment::Failure::withoutException;
    env.failCall((what & 128) != 0 ? 1 + bytes.next() % 6 : 0, failure);
    FakeBitmap& bitmap = bitmaps[bytes.next() % std::size(bitmaps)];
    const std::size_t mostRows = bitmap.bytes.size() / bitmap.info.stride;
    bitmap.heightOnceLocked =
        (what & 32) != 0 ? static_cast<std::uint32_t>(bytes.next() % (mostRows + 1)) : 0;
    const std::uint8_t which = bytes.next();
    const jlong handle = which > 250 ? bytes.next<jlong>() : handles[which % handles.size()];
    switch (what % 5) {
      case 0: {
        const jlong opened = natives.init(bitmap.reference());
        if (opened != 0) handles.push_back(opened), ++open;
        break;
      }
      case 1: {
        FakeFaces faces = facesOf(bytes);
        natives.preprocess(which % 3 == 0 ? nullptr : static_cast<jobjectArray>(faces), handle);
        break;
      }
      case 2: {
        FakeString filter(wordOf(bytes)), params(wordOf(bytes));
        natives.apply(handle, bitmap.reference(),
                      which % 16 == 1 ? nullptr : static_cast<jstring>(filter),
                      which % 16 == 2 ? nullptr : static_cast<jstring>(params));
        break;
      }
      case 3: {
        const bool isOpen = openSessions().find(handle) != nullptr;
        natives.release(handle);
        open -= isOpen ? 1 : 0;
        break;
      }
      case 4: {
        FakeBitmap& other = bitmaps[bytes.next() % std::size(bitmaps)];
        natives.similarity(bitmap.reference(), bytes.next<double>(), bytes.next(),
                           other.reference(), bytes.next<double>(), bytes.next());
        break;
      }
    }
    env.failCall(0);
    env.takeException();
    check(env.violations().empty());
    for (const FakeBitmap& each : bitmaps) check(each.locks == 0);
    check(openSessions().size() == open);
  }
  for (const jlong handle : handles) natives.release(handle);
  check(env.violations().empty());
  takeLogLines();
  return 0;
}
