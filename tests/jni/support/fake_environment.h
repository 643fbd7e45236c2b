#pragma once

#include <jni.h>

#include <array>
#include <cstddef>
#include <cstdint>
#include <map>
#include <string>
#include <vector>

namespace pelorin::test_support {

/// What a Java object is to the natives: a class, a string, an array, a RectF, a buffer, an
/// exception. Natives see its address.
struct FakeObject {
  std::string className = {};  ///< Of a class object: "java/lang/Class".
  std::string text = {};  ///< A string's characters, a class object's name, an exception's message.
  std::vector<FakeObject*> elements = {};
  std::map<std::string, float> floats = {};  ///< Fields by name.
  std::map<std::string, int> ints = {};
  void* address = nullptr;   ///< Of a direct buffer.
  std::size_t capacity = 0;  ///< Its bytes.
  // Elements of an array of numbers.
  std::vector<std::uint8_t> bytes = {};
  std::vector<float> floatElements = {};
  std::vector<double> doubleElements = {};
};

/// A Java environment without Java, for the thread that makes it. It checks the rules that a real
/// one leaves to luck, and any call that can fail in Java can be made to fail. Nothing is allocated
/// in its calls, so that allocations can be made to fail as well.
class FakeEnvironment : public JNIEnv {
 public:
  FakeEnvironment();
  ~FakeEnvironment();
  FakeEnvironment(const FakeEnvironment&) = delete;
  FakeEnvironment& operator=(const FakeEnvironment&) = delete;

  /// The virtual machine of all of them.
  static JavaVM* machine();

  /// How a call fails: with what its interface calls failure, with an exception pending besides, or
  /// as the two in turn for a function that raises no exception.
  enum class Failure { withoutException, withException };

  enum class Later { succeed, fail };

  /// Lets the call of number `call` (from 1, of those that can fail) fail, and later ones as `later` says;
  /// 0 ends that.
  void failCall(int call, Failure failure = Failure::withException, Later later = Later::succeed);
  /// Calls that can fail, since `failCall`.
  int fallibleCalls() const { return fallibleCalls_; }
  /// Whether the call that `failCall` means has come.
  bool failed() const { return failed_; }

  /// To be asked by every double of a call that can fail: whether it should, an exception raised if
  /// so wished.
  bool shouldFail(const char* function);
  /// To be told by every double of a call that must not be made while an exception is pending.
  void checkNothingPending(const char* function);
  void violate(const char* what, const char* function);

  /// What natives did wrong so far, empty when nothing: calls while an exception is pending, 16 or
  /// more local references, use of dead references, and, when no native runs, references or
  /// characters that were not released.
  std::string violations();

  /// "class: message" of the pending exception, which it clears; empty when there is none.
  std::string takeException();
  void raise(const char* className, const char* message);
  bool pending() const { return pendingClass_[0] != '\0'; }

  /// The object a reference stands for; null for null.
  FakeObject* resolve(jobject reference, const char* function);
  /// A local reference.
  jobject newLocal(FakeObject* object, const char* function);

  int globalReferences = 0;
  int weakReferences = 0;
  int charactersInUse = 0;
  int localReferences = 0;
  int mostLocalReferences = 0;

  /// The array of numbers that a native made last.
  FakeObject made;

  /// The functions given to RegisterNatives by any environment, by name and signature.
  static std::map<std::string, void*, std::less<>>& registered();
  /// Value of ImageDupeDetector.SIMILARITY_ERROR.
  static float similarityError;
  /// A class, field or method that is missing: "class" or "class.member".
  std::string missing;

 private:
  friend struct FakeFunctions;

  int failing_ = 0, fallibleCalls_ = 0;
  Failure failure_ = Failure::withException;
  Later later_ = Later::succeed;
  bool failed_ = false;
  std::array<FakeObject*, 64> locals_{};
  char pendingClass_[128] = "", pendingMessage_[1100] = "";
  char violations_[600] = "";
  FakeObject exception_, string_;
};

}  // namespace pelorin::test_support
