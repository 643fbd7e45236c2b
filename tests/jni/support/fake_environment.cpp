#include "tests/jni/support/fake_environment.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <mutex>

namespace pelorin::test_support {

namespace {

thread_local FakeEnvironment* currentEnvironment = nullptr;

/// All classes there are. A map that never changes after its making, so any thread may read it.
std::map<std::string, FakeObject, std::less<>>& classes() {
  static std::map<std::string, FakeObject, std::less<>> all = [] {
    std::map<std::string, FakeObject, std::less<>> made;
    for (const char* name :
         {"android/graphics/RectF", "android/graphics/Bitmap",
          "com/pelorin/photos/quenby/autoenhance/QuenbyEngine",
          "com/pelorin/photos/quenby/autoenhance/ImageDupeDetector", "java/lang/OutOfMemoryError",
          "java/lang/IllegalArgumentException", "java/lang/RuntimeException", "java/io/IOException",
          "java/util/concurrent/CancellationException",
          "com/pelorin/photos/quenby/autoenhance/PhotoBytes",
          "com/pelorin/photos/quenby/autoenhance/PhotoException"})
      made[name] = {.className = "java/lang/Class", .text = name};
    return made;
  }();
  return all;
}

/// Identifiers of members are their names.
template <typename Id>
Id idOf(const char* name) {
  static const char* const known[] = {"left",       "top",          "right",
                                      "bottom",     "width",        "height",
                                      "stride",     "format",       "SIMILARITY_ERROR",
                                      "lockPixels", "unlockPixels", "<init>"};
  for (const char* candidate : known)
    if (std::strcmp(candidate, name) == 0)
      return reinterpret_cast<Id>(const_cast<char*>(candidate));
  return nullptr;
}

template <typename Id>
const char* nameOf(Id id) {
  return reinterpret_cast<const char*>(id);
}

void unexpectedCall() {
  std::fputs("a native called a JNI function that the fake environment does not have\n", stderr);
  std::abort();
}

}  // namespace

std::map<std::string, void*, std::less<>>& FakeEnvironment::registered() {
  static std::map<std::string, void*, std::less<>> all;
  return all;
}

float FakeEnvironment::similarityError = -2222.0f;

/// The functions of the table.
struct FakeFunctions {
  static FakeEnvironment& of(JNIEnv* env) { return *static_cast<FakeEnvironment*>(env); }

  static bool isMissing(FakeEnvironment& fake, const char* owner, const char* member) {
    const std::string& missing = fake.missing;
    const std::size_t ownerLength = std::strlen(owner);
    if (missing.compare(0, ownerLength, owner) != 0) return false;
    if (member == nullptr) return missing.size() == ownerLength;
    return missing.size() > ownerLength &&
           missing.compare(ownerLength + 1, missing.npos, member) == 0;
  }

  static jclass findClass(JNIEnv* env, const char* name) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("FindClass");
    if (fake.shouldFail("FindClass")) return nullptr;
    const auto found = classes().find(std::string_view(name));
    if (found == classes().end() || isMissing(fake, name, nullptr)) {
      fake.raise("java/lang/NoClassDefFoundError", name);
      return nullptr;
    }
    return static_cast<jclass>(fake.newLocal(&found->second, "FindClass"));
  }

  static jclass getObjectClass(JNIEnv* env, jobject object) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("GetObjectClass");
    const auto found = classes().find(fake.resolve(object, "GetObjectClass")->className);
    return static_cast<jclass>(fake.newLocal(&found->second, "GetObjectClass"));
  }

  template <typename Id>
  static Id memberId(JNIEnv* env, jclass owner, const char* name, const char*) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("GetFieldID");
    if (fake.shouldFail("GetFieldID")) return nullptr;
    const Id id = idOf<Id>(name);
    if (id == nullptr || isMissing(fake, fake.resolve(owner, "GetFieldID")->text.c_str(), name)) {
      fake.raise("java/lang/NoSuchFieldError", name);
      return nullptr;
    }
    return id;
  }

  static jfloat getFloatField(JNIEnv* env, jobject object, jfieldID field) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("GetFloatField");
    return fake.resolve(object, "GetFloatField")->floats.at(nameOf(field));
  }

  static jint getIntField(JNIEnv* env, jobject object, jfieldID field) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("GetIntField");
    return fake.resolve(object, "GetIntField")->ints.at(nameOf(field));
  }

  static jfloat getStaticFloatField(JNIEnv* env, jclass, jfieldID) {
    of(env).checkNothingPending("GetStaticFloatField");
    return FakeEnvironment::similarityError;
  }

  // The bitmap's two methods: locks are counted in a field, a recycled one has no buffer.
  static jobject callObjectMethod(JNIEnv* env, jobject object, jmethodID, va_list) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("CallObjectMethod");
    if (fake.shouldFail("CallObjectMethod")) return nullptr;
    FakeObject* const bitmap = fake.resolve(object, "CallObjectMethod");
    if (bitmap->elements.empty()) return nullptr;
    ++bitmap->ints.at("locks");
    return fake.newLocal(bitmap->elements[0], "CallObjectMethod");
  }

  static void callVoidMethod(JNIEnv* env, jobject object, jmethodID, va_list) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("CallVoidMethod");
    if (fake.shouldFail("CallVoidMethod")) return;
    --fake.resolve(object, "CallVoidMethod")->ints.at("locks");
  }

  static void* getDirectBufferAddress(JNIEnv* env, jobject buffer) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("GetDirectBufferAddress");
    return fake.resolve(buffer, "GetDirectBufferAddress")->address;
  }

  static jlong getDirectBufferCapacity(JNIEnv* env, jobject buffer) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("GetDirectBufferCapacity");
    return static_cast<jlong>(fake.resolve(buffer, "GetDirectBufferCapacity")->capacity);
  }

  // Arrays of numbers. Natives get one at a time, whose room is made beforehand.
  template <auto elements, typename Array>
  static Array newArray(JNIEnv* env, jsize count) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("New...Array");
    if (fake.shouldFail("New...Array")) return nullptr;
    (fake.made.*elements).resize(static_cast<std::size_t>(count));
    return static_cast<Array>(fake.newLocal(&fake.made, "New...Array"));
  }

  template <auto elements, typename Array, typename Element>
  static void getRegion(JNIEnv* env, Array array, jsize start, jsize count, Element* to) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("Get...ArrayRegion");
    const auto& from = fake.resolve(array, "Get...ArrayRegion")->*elements;
    if (static_cast<std::size_t>(start) + static_cast<std::size_t>(count) > from.size())
      fake.violate("outside the array", "Get...ArrayRegion");
    else
      std::copy_n(from.begin() + start, count, to);
  }

  template <auto elements, typename Array, typename Element>
  static void setRegion(JNIEnv* env, Array array, jsize start, jsize count, const Element* from) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("Set...ArrayRegion");
    auto& to = fake.resolve(array, "Set...ArrayRegion")->*elements;
    if (static_cast<std::size_t>(start) + static_cast<std::size_t>(count) > to.size())
      fake.violate("outside the array", "Set...ArrayRegion");
    else
      std::copy_n(from, count, to.begin() + start);
  }

  /// Of PhotoException alone: a number and a text.
  static jobject newObject(JNIEnv* env, jclass type, jmethodID, va_list arguments) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("NewObject");
    if (fake.shouldFail("NewObject")) return nullptr;
    const int number = va_arg(arguments, jint);
    const FakeObject* const text = fake.resolve(va_arg(arguments, jobject), "NewObject");
    std::snprintf(fake.pendingMessage_, sizeof(fake.pendingMessage_), "%d %s", number,
                  text->text.c_str());
    fake.exception_.className.assign(fake.resolve(type, "NewObject")->text);
    fake.exception_.text.assign(fake.pendingMessage_);
    return fake.newLocal(&fake.exception_, "NewObject");
  }

  static jint registerNatives(JNIEnv* env, jclass owner, const JNINativeMethod* methods,
                              jint count) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("RegisterNatives");
    if (fake.shouldFail("RegisterNatives")) return JNI_ERR;
    fake.resolve(owner, "RegisterNatives");
    for (jint i = 0; i < count; ++i)
      FakeEnvironment::registered()[std::string(methods[i].name) + methods[i].signature] =
          methods[i].fnPtr;
    return JNI_OK;
  }

  static jstring newStringUTF(JNIEnv* env, const char* characters) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("NewStringUTF");
    if (fake.shouldFail("NewStringUTF")) return nullptr;
    fake.string_.text.assign(characters);
    return static_cast<jstring>(fake.newLocal(&fake.string_, "NewStringUTF"));
  }

  static const char* getStringUTFChars(JNIEnv* env, jstring text, jboolean*) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("GetStringUTFChars");
    if (fake.shouldFail("GetStringUTFChars")) return nullptr;
    ++fake.charactersInUse;
    return fake.resolve(text, "GetStringUTFChars")->text.c_str();
  }

  static void releaseStringUTFChars(JNIEnv* env, jstring text, const char* characters) {
    FakeEnvironment& fake = of(env);
    if (characters != fake.resolve(text, "ReleaseStringUTFChars")->text.c_str())
      fake.violate("wrong characters", "ReleaseStringUTFChars");
    --fake.charactersInUse;
  }

  static jsize getArrayLength(JNIEnv* env, jarray array) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("GetArrayLength");
    const FakeObject& object = *fake.resolve(array, "GetArrayLength");
    return static_cast<jsize>(object.elements.size() + object.bytes.size() +
                              object.floatElements.size());
  }

  static jobject getObjectArrayElement(JNIEnv* env, jobjectArray array, jsize index) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("GetObjectArrayElement");
    if (fake.shouldFail("GetObjectArrayElement")) return nullptr;
    return fake.newLocal(fake.resolve(array, "GetObjectArrayElement")->elements.at(index),
                         "GetObjectArrayElement");
  }

  // Arrays of bytes, which are copied into the element that is there.
  static void setObjectArrayElement(JNIEnv* env, jobjectArray array, jsize index, jobject value) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("SetObjectArrayElement");
    if (fake.shouldFail("SetObjectArrayElement")) return;
    FakeObject* const element =
        fake.resolve(array, "SetObjectArrayElement")->elements.at(static_cast<std::size_t>(index));
    element->bytes = fake.resolve(value, "SetObjectArrayElement")->bytes;
  }

  static jint throwObject(JNIEnv* env, jthrowable object) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("Throw");
    const FakeObject* const exception = fake.resolve(object, "Throw");
    fake.raise(exception->className.c_str(), exception->text.c_str());
    return JNI_OK;
  }

  static jint throwNew(JNIEnv* env, jclass type, const char* message) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("ThrowNew");
    if (fake.shouldFail("ThrowNew")) return JNI_ERR;
    fake.raise(fake.resolve(type, "ThrowNew")->text.c_str(), message);
    return JNI_OK;
  }

  static jthrowable exceptionOccurred(JNIEnv* env) {
    FakeEnvironment& fake = of(env);
    if (!fake.pending()) return nullptr;
    fake.exception_.className.assign(fake.pendingClass_);
    fake.exception_.text.assign(fake.pendingMessage_);
    return static_cast<jthrowable>(fake.newLocal(&fake.exception_, "ExceptionOccurred"));
  }

  static void exceptionClear(JNIEnv* env) { of(env).pendingClass_[0] = '\0'; }
  static jboolean exceptionCheck(JNIEnv* env) { return of(env).pending() ? JNI_TRUE : JNI_FALSE; }

  static jobject newGlobalRef(JNIEnv* env, jobject object) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("NewGlobalRef");
    if (fake.shouldFail("NewGlobalRef")) return nullptr;
    ++fake.globalReferences;
    return reinterpret_cast<jobject>(fake.resolve(object, "NewGlobalRef"));
  }

  static void deleteGlobalRef(JNIEnv* env, jobject) { --of(env).globalReferences; }

  static jweak newWeakGlobalRef(JNIEnv* env, jobject object) {
    FakeEnvironment& fake = of(env);
    fake.checkNothingPending("NewWeakGlobalRef");
    if (fake.shouldFail("NewWeakGlobalRef")) return nullptr;
    ++fake.weakReferences;
    return reinterpret_cast<jweak>(fake.resolve(object, "NewWeakGlobalRef"));
  }

  static void deleteWeakGlobalRef(JNIEnv* env, jweak) { --of(env).weakReferences; }

  static void deleteLocalRef(JNIEnv* env, jobject reference) {
    FakeEnvironment& fake = of(env);
    if (reference == nullptr) return;
    const auto slot = reinterpret_cast<FakeObject**>(reference);
    if (slot < fake.locals_.begin() || slot >= fake.locals_.end() || *slot == nullptr) {
      fake.violate("no local reference", "DeleteLocalRef");
      return;
    }
    *slot = nullptr;
    --fake.localReferences;
  }

  static jint getEnv(JavaVM*, void** env, jint) {
    *env = static_cast<JNIEnv*>(currentEnvironment);
    return currentEnvironment == nullptr ? JNI_EDETACHED : JNI_OK;
  }

  static const JNINativeInterface_* table() {
    static const JNINativeInterface_ functions = [] {
      JNINativeInterface_ made;
      auto* const entries = reinterpret_cast<void (**)()>(&made);
      std::fill_n(entries, sizeof(made) / sizeof(*entries), &unexpectedCall);
      made.FindClass = findClass;
      made.GetObjectClass = getObjectClass;
      made.GetFieldID = memberId<jfieldID>;
      made.GetStaticFieldID = memberId<jfieldID>;
      made.GetMethodID = memberId<jmethodID>;
      made.GetFloatField = getFloatField;
      made.GetIntField = getIntField;
      made.GetStaticFloatField = getStaticFloatField;
      made.CallObjectMethodV = callObjectMethod;
      made.CallVoidMethodV = callVoidMethod;
      made.GetDirectBufferCapacity = getDirectBufferCapacity;
      made.NewByteArray = newArray<&FakeObject::bytes, jbyteArray>;
      made.NewFloatArray = newArray<&FakeObject::floatElements, jfloatArray>;
      made.NewDoubleArray = newArray<&FakeObject::doubleElements, jdoubleArray>;
      made.GetByteArrayRegion = getRegion<&FakeObject::bytes, jbyteArray, jbyte>;
      made.GetFloatArrayRegion = getRegion<&FakeObject::floatElements, jfloatArray, jfloat>;
      made.SetByteArrayRegion = setRegion<&FakeObject::bytes, jbyteArray, jbyte>;
      made.SetFloatArrayRegion = setRegion<&FakeObject::floatElements, jfloatArray, jfloat>;
      made.SetDoubleArrayRegion = setRegion<&FakeObject::doubleElements, jdoubleArray, jdouble>;
      made.NewObjectV = newObject;
      made.GetDirectBufferAddress = getDirectBufferAddress;
      made.RegisterNatives = registerNatives;
      made.NewStringUTF = newStringUTF;
      made.GetStringUTFChars = getStringUTFChars;
      made.ReleaseStringUTFChars = releaseStringUTFChars;
      made.GetArrayLength = getArrayLength;
      made.GetObjectArrayElement = getObjectArrayElement;
      made.SetObjectArrayElement = setObjectArrayElement;
      made.Throw = throwObject;
      made.ThrowNew = throwNew;
      made.ExceptionOccurred = exceptionOccurred;
      made.ExceptionClear = exceptionClear;
      made.ExceptionCheck = exceptionCheck;
      made.NewGlobalRef = newGlobalRef;
      made.DeleteGlobalRef = deleteGlobalRef;
      made.NewWeakGlobalRef = newWeakGlobalRef;
      made.DeleteWeakGlobalRef = deleteWeakGlobalRef;
      made.DeleteLocalRef = deleteLocalRef;
      return made;
    }();
    return &functions;
  }
};

FakeEnvironment::FakeEnvironment() {
  functions = FakeFunctions::table();
  classes();
  // Room for any exception or string, so that none of them allocates.
  string_.className = "java/lang/String";
  string_.text.reserve(sizeof(pendingMessage_));
  made.bytes.reserve(1 << 18);
  made.floatElements.reserve(256);
  made.doubleElements.reserve(8);
  exception_.className.reserve(sizeof(pendingClass_));
  exception_.text.reserve(sizeof(pendingMessage_));
  currentEnvironment = this;
}

FakeEnvironment::~FakeEnvironment() {
  currentEnvironment = nullptr;
}

JavaVM* FakeEnvironment::machine() {
  static JNIInvokeInterface_ functions{};
  functions.GetEnv = FakeFunctions::getEnv;
  static JavaVM vm{&functions};
  return &vm;
}

void FakeEnvironment::failCall(int call, Failure failure, Later later) {
  failing_ = call;
  failure_ = failure;
  later_ = later;
  fallibleCalls_ = 0;
  failed_ = false;
}

bool FakeEnvironment::shouldFail(const char* function) {
  ++fallibleCalls_;
  const bool isLater = failing_ > 0 && fallibleCalls_ > failing_ && later_ == Later::fail;
  if (fallibleCalls_ != failing_ && !isLater) return false;
  failed_ = true;
  if (failure_ == Failure::withException) raise("test/Injected", function);
  return true;
}

void FakeEnvironment::checkNothingPending(const char* function) {
  if (pending()) violate("called with an exception pending", function);
}

void FakeEnvironment::violate(const char* what, const char* function) {
  const std::size_t used = std::strlen(violations_);
  std::snprintf(violations_ + used, sizeof(violations_) - used, "%s: %s\n", function, what);
}

std::string FakeEnvironment::violations() {
  if (localReferences != 0) violate("local references left", "return");
  if (charactersInUse != 0) violate("characters not released", "return");
  if (mostLocalReferences >= 16) violate("too many local references", "return");
  return violations_;
}

std::string FakeEnvironment::takeException() {
  if (!pending()) return "";
  const std::string taken = std::string(pendingClass_) + ": " + pendingMessage_;
  pendingClass_[0] = '\0';
  return taken;
}

void FakeEnvironment::raise(const char* className, const char* message) {
  std::snprintf(pendingClass_, sizeof(pendingClass_), "%s", className);
  std::snprintf(pendingMessage_, sizeof(pendingMessage_), "%s", message);
}

FakeObject* FakeEnvironment::resolve(jobject reference, const char* function) {
  if (reference == nullptr) {
    std::fprintf(stderr, "%s was given null, which ends a real virtual machine\n", function);
    std::abort();
  }
  const auto slot = reinterpret_cast<FakeObject**>(reference);
  const bool isLocal = slot >= locals_.begin() && slot < locals_.end();
  if (!isLocal) return reinterpret_cast<FakeObject*>(reference);
  if (*slot != nullptr) return *slot;
  std::fprintf(stderr, "%s was given a deleted reference\n", function);
  std::abort();
}

jobject FakeEnvironment::newLocal(FakeObject* object, const char* function) {
  if (object == nullptr) return nullptr;
  mostLocalReferences = std::max(mostLocalReferences, ++localReferences);
  const auto slot = std::find(locals_.begin(), locals_.end(), nullptr);
  if (slot == locals_.end()) {
    std::fprintf(stderr, "%s: no room for local references\n", function);
    std::abort();
  }
  *slot = object;
  return reinterpret_cast<jobject>(slot);
}

}  // namespace pelorin::test_support
