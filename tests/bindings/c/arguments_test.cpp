// Every function of the header with every kind of argument. What a parameter is tried with follows from
// its type, what is right for it from its name: a function that the header gains is tried with the others,
// and does not compile here, or fails, where one of its parameters is of a new kind.
#include <gtest/gtest.h>

#include <array>
#include <cctype>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <limits>
#include <map>
#include <random>
#include <string>
#include <string_view>
#include <tuple>
#include <type_traits>
#include <utility>
#include <vector>

#include "quenby/quenby.h"

extern "C" {
#include "tests/bindings/c/checks.h"
}

namespace {

/// What a call comes to where everything else is right.
enum class Meaning { right, wrong, either };

template <typename T>
struct Choice {
  T value;
  Meaning meaning;
};

/// What a call writes to, with what stood there before; nothing is written elsewhere.
struct Room {
  std::vector<unsigned char> now, before;
  bool isObject = false;                    ///< Cleared by a call that fails.
  std::function<void(void*)> release = {};  ///< Of what a call that succeeds left here.

  void reset() { now = before; }
};

struct Parameter {
  std::string function, name;
  Room room = {};
};

template <typename T>
struct Pool {  // objects that all calls share
  static T* shared;
};
template <typename T>
T* Pool<T>::shared = nullptr;
quenby_cancel* requested = nullptr;  // one that asked already

constexpr std::uint32_t width = 120, height = 100;

/// Bytes behind which there is room for every size that a call is told.
const std::vector<std::uint8_t>& jpeg() {
  static const std::vector<std::uint8_t> file = [] {
    const bytes made = made_photo(width, height, 1);
    std::vector<std::uint8_t> copy(made.data, made.data + made.size);
    std::free(made.data);
    return copy;
  }();
  return file;
}

const quenby_pixels& rightPixels() {
  static const std::vector<std::uint8_t> rgba = [] {
    quenby_pixels made = made_pixels(width, height, 1);
    std::vector<std::uint8_t> copy(made.rgba, made.rgba + width * height * 4);
    free_pixels(&made);
    return copy;
  }();
  static const quenby_pixels pixels = {rgba.data(), width, height, width * 4};
  return pixels;
}

void runInPlace(void*, std::size_t tasks, void (*task)(void*, std::size_t), void* state) {
  for (std::size_t i = 0; i < tasks; ++i) task(state, i);
}

/// What a number is where it is right. A parameter of another name is a new kind of number: here is its row.
const std::map<std::string, std::int64_t, std::less<>>& rightNumbers() {
  static const std::map<std::string, std::int64_t, std::less<>> numbers = {
      {"arc", 9},
      {"capacity", 4},
      {"count", 1},
      {"face_count", 1},
      {"flags", 0},
      {"index", 0},
      {"milliseconds", 60000},
      {"pair_count", 1},
      {"same_orientation", 1},
      {"shot_count", 2},
      {"size", static_cast<std::int64_t>(jpeg().size())},
      {"stride", width * 4},
      {"suppress", 1},
      {"threshold", 20}};
  return numbers;
}

/// Whether the header says that null may stand here, whatever else stands beside it.
bool mayBeNull(const Parameter& parameter) {
  const std::string& name = parameter.name;
  if (name == "format") return parameter.function != "quenby_write";
  if (name == "pixels") return parameter.function == "quenby_photo_save";
  return name == "options" || name == "open" || name == "save" || name == "cancel" ||
         name == "block_distances";
}

template <typename T>
constexpr bool hasSize = requires(T value) {
  value.struct_size;
};

/// Structs of input, the right one first.
template <typename T>
std::vector<Choice<T>> inputs() {
  static const std::uint8_t few[64] = {};
  static quenby_workers workers = {sizeof(workers), 2, nullptr, runInPlace};
  constexpr float nan = std::numeric_limits<float>::quiet_NaN();
  constexpr float infinity = std::numeric_limits<float>::infinity();
  constexpr std::uint32_t most = UINT32_MAX;
  using enum Meaning;
  std::vector<Choice<T>> structs;
  if constexpr (std::is_same_v<T, quenby_pixels>) {
    structs = {{rightPixels(), right},         {{nullptr, 2, 2, 8}, wrong},
               {{few, 0, 2, 8}, wrong},        {{few, 2, 0, 8}, wrong},
               {{few, 2, 2, 7}, wrong},        {{few, most, most, SIZE_MAX}, wrong},
               {{few, 1, 2, SIZE_MAX}, wrong}, {{few, 1, 1, 4}, either}};
  } else if constexpr (std::is_same_v<T, quenby_grey>) {
    structs = {{{rightPixels().rgba, width, height, width}, right},
               {{nullptr, 2, 2, 2}, wrong},
               {{few, 0, 2, 2}, wrong},
               {{few, 4, 4, 3}, wrong},
               {{few, 1, 2, SIZE_MAX}, wrong},
               {{few, most, 1, 4}, wrong},
               {{few, 1, 1, 1}, either}};
  } else if constexpr (std::is_same_v<T, quenby_face>) {
    structs = {
        {{0.2f, 0.2f, 0.6f, 0.8f, 0}, right}, {{0, 0, 1, nan, 0}, wrong},
        {{-infinity, 0, 1, 1, 0}, wrong},     {{9000, 9000, 9900, 9900, 1}, wrong},
        {{0.6f, 0, 0.2f, 1, 0}, either},      {{-3e38f, -3e38f, 3e38f, 3e38f, most}, either}};
  } else if constexpr (std::is_same_v<T, quenby_corner>) {
    structs = {{{40, 40, 9}, right}, {{INT32_MIN, INT32_MAX, 0}, either}, {{-1, 2, -1}, either}};
  } else if constexpr (std::is_same_v<T, quenby_shot>) {
    structs = {{{{}, 1, 0, 5, 5}, right},
               {{{}, 1, 0, infinity, 5}, wrong},
               {{{}, 1, 0, 5, -infinity}, wrong},
               {{{nan, infinity}, INT32_MIN, 0, nan, nan}, either}};
  } else if constexpr (std::is_same_v<T, quenby_pair>) {
    structs = {{{0, 1, 0, 2, 0.1f, 0, 0}, right},
               {{1, 1, 0, 2, 0.1f, 0, 0}, wrong},
               {{0, UINT64_MAX, 0, 2, 0.1f, 0, 0}, wrong},
               {{0, 1, 0, nan, 0.1f, 0, 0}, wrong},
               {{0, 1, nan, infinity, nan, most, most}, either}};
  } else if constexpr (std::is_same_v<T, quenby_workers>) {
    structs = {{workers, right},
               {{sizeof(T), 0, nullptr, runInPlace}, wrong},
               {{sizeof(T), SIZE_MAX, nullptr, runInPlace}, wrong},
               {{sizeof(T), 2, nullptr, nullptr}, wrong}};
  } else if constexpr (std::is_same_v<T, quenby_open_options>) {
    T all{};
    all.struct_size = sizeof(T);
    structs = {{all, right}};
    const auto with = [&](auto field, auto value, Meaning meaning) {
      T one = all;
      one.*field = value;
      structs.push_back({one, meaning});
    };
    with(&T::scale, 3, wrong);
    with(&T::scale, INT32_MIN, wrong);
    with(&T::rotate, 45, wrong);
    with(&T::rotate, INT32_MAX, wrong);
    with(&T::max_scans, -1, wrong);
    with(&T::max_segments, INT32_MIN, wrong);
    with(&T::flags, most, wrong);
    with(&T::max_pixels, UINT64_MAX, right);
    with(&T::max_scanned_pixels, UINT64_MAX, right);
    with(&T::max_compressed_pixels, UINT64_MAX, right);
    with(&T::max_pixels, 1u, either);
    with(&T::max_bytes, UINT64_MAX, right);
    with(&T::max_bytes, 1u, either);
    with(&T::workers, &workers, either);
  } else if constexpr (std::is_same_v<T, quenby_save_options>) {
    const std::size_t size = sizeof(T);
    structs = {{{size, 0, 0, 0}, right},         {{size, -1, 0, 0}, wrong},
               {{size, INT32_MIN, 0, 0}, wrong}, {{size, 101, 0, 0}, wrong},
               {{size, 0, most, 0}, wrong},      {{size, 0, 0, most}, wrong},
               {{size, 100, 0, 1}, right}};
  } else {
    static_assert(!sizeof(T), "a new struct: what is it tried with?");
  }
  if constexpr (hasSize<T>) {
    T one = structs.front().value;
    for (const std::size_t size : {std::size_t{0}, sizeof(std::size_t), SIZE_MAX}) {
      one.struct_size = size;
      structs.push_back({one, wrong});
    }
  }
  return structs;
}

/// Structs in a place that stays, as arrays of a few of the same.
template <typename T>
const std::vector<Choice<const T*>>& pointersToInputs() {
  static std::vector<std::vector<T>> arrays;
  static const std::vector<Choice<const T*>> pointers = [] {
    std::vector<Choice<const T*>> made;
    for (const Choice<T>& choice : inputs<T>()) {
      arrays.emplace_back(4, choice.value);
      made.push_back({arrays.back().data(), choice.meaning});
    }
    return made;
  }();
  return pointers;
}

template <typename T>
void release(void* made) {
  if constexpr (std::is_same_v<T, quenby_photo*>) quenby_photo_free(*static_cast<T*>(made));
  if constexpr (std::is_same_v<T, quenby_file*>) quenby_file_free(*static_cast<T*>(made));
  if constexpr (std::is_same_v<T, quenby_session*>) quenby_session_free(*static_cast<T*>(made));
  if constexpr (std::is_same_v<T, quenby_cancel*>) quenby_cancel_free(*static_cast<T*>(made));
  if constexpr (std::is_same_v<T, quenby_threads*>) quenby_threads_free(*static_cast<T*>(made));
  if constexpr (std::is_same_v<T, quenby_pairs>) quenby_pairs_free(static_cast<T*>(made));
  if constexpr (std::is_same_v<T, quenby_corners>) quenby_corners_free(static_cast<T*>(made));
  if constexpr (std::is_same_v<T, quenby_descriptors>)
    quenby_descriptors_free(static_cast<T*>(made));
}

template <typename T>
constexpr bool isObject =
    std::is_pointer_v<T> || std::is_same_v<T, quenby_pairs> || std::is_same_v<T, quenby_corners> ||
    std::is_same_v<T, quenby_descriptors>;

template <typename T>
concept Complete = requires {
  sizeof(T);
};

/// Room for what a call gives; of bytes and numbers for a whole picture.
template <typename T>
std::vector<Choice<T*>> outputs(Parameter& parameter) {
  Room& room = parameter.room;
  // Beyond a struct, for a caller's newer one; beyond arrays of four, for those of 256 numbers.
  room.before.assign(sizeof(T) == 1 ? width * height * 4 : sizeof(T) * 4 + 4096, 0xA5);
  room.isObject = isObject<T>;
  if constexpr (hasSize<T>) {
    const std::size_t size = sizeof(T);
    std::memcpy(room.before.data(), &size, sizeof(size));
  }
  // What a failed call leaves is free to be released.
  if constexpr (isObject<T>) room.release = release<T>;
  room.reset();
  return {{reinterpret_cast<T*>(room.now.data()), Meaning::right}};
}

template <typename T>
std::vector<Choice<T>> numbers(const Parameter& parameter) {
  using enum Meaning;
  using Limits = std::numeric_limits<T>;
  if constexpr (std::is_floating_point_v<T>) {
    return {{T(0.25), right},
            {Limits::quiet_NaN(), parameter.name == "threshold" ? wrong : right},
            {Limits::infinity(), right},
            {-Limits::infinity(), right},
            {Limits::max(), right},
            {Limits::lowest(), right},
            {Limits::denorm_min(), right},
            {-T(0), right}};
  } else {
    const auto found = rightNumbers().find(parameter.name);
    EXPECT_NE(found, rightNumbers().end()) << parameter.name << " is a number of a new kind";
    if (found == rightNumbers().end()) return {{T(0), either}};
    const bool isAnything = parameter.name == "milliseconds" ||
                            (parameter.name == "capacity" && parameter.function == "quenby_niqe");
    std::vector<Choice<T>> made = {{static_cast<T>(found->second), right},
                                   {T(0), either},
                                   {T(1), either},
                                   {Limits::max(), isAnything ? right : wrong}};
    if constexpr (std::is_signed_v<T>) {
      made.back().meaning = parameter.name == "arc" ? wrong : right;
      made.push_back({T(-1), made.back().meaning});
      made.push_back({Limits::min(), made.back().meaning});
    } else {
      made.push_back({Limits::max() / 2 + 1, isAnything ? right : wrong});
    }
    return made;
  }
}

template <typename T>
std::vector<Choice<T>> choices(Parameter& parameter) {
  using enum Meaning;
  std::vector<Choice<T>> made;
  if constexpr (std::is_arithmetic_v<T>) {
    return numbers<T>(parameter);
  } else if constexpr (std::is_same_v<T, const char*>) {
    static const std::string longText(5000, 'q');
    const bool isParams = parameter.name == "params";
    const char* const known = isParams                     ? "slider=0.4;"
                              : parameter.name == "format" ? "JPEG"
                                                           : "AE0";
    made = {{known, right}};
    for (const char* const text :
         {"", "none", "\x80\xFF\xC3", longText.c_str(), "%s%n%d", "JPEG\n"}) {
      made.push_back({text, isParams ? either : wrong});
    }
    if (isParams) {
      for (const char* const text :
           {"slider=nan;", "slider=-inf;", "slider=1e39;", "slider=;=;;"}) {
        made.push_back({text, either});
      }
    }
    made.push_back({nullptr, isParams ? either : mayBeNull(parameter) ? right : wrong});
    return made;
  } else {
    using Pointed = std::remove_pointer_t<T>;
    using Plain = std::remove_const_t<Pointed>;
    if constexpr (!Complete<Plain>) {
      EXPECT_NE(Pool<Plain>::shared, nullptr);
      made = {{Pool<Plain>::shared, right}};
      if constexpr (std::is_same_v<T, const quenby_cancel*>) made.push_back({requested, either});
    } else if constexpr (std::is_same_v<Plain, quenby_error>) {
      made = {{&error, right}, {nullptr, either}};
      return made;
    } else if constexpr (std::is_same_v<T, const std::uint8_t*>) {
      static const std::vector<std::uint8_t> zeros(jpeg().size());
      made = {{jpeg().data(), right}, {zeros.data(), either}};
    } else if constexpr (std::is_same_v<T, const float*>) {
      static const std::vector<float> zeros(256), extremes(256, std::numeric_limits<float>::max()),
          none(256, std::numeric_limits<float>::quiet_NaN());
      made = {{zeros.data(), right}, {extremes.data(), right}, {none.data(), right}};
    } else if constexpr (std::is_const_v<Pointed>) {
      made = pointersToInputs<Plain>();
    } else {
      made = outputs<Plain>(parameter);
    }
    // Of what is written, only the blocks of a picture are not always wanted.
    const bool isOptional = std::is_const_v<Pointed> || parameter.name == "block_distances";
    made.push_back({nullptr, isOptional && mayBeNull(parameter) ? right : wrong});
    return made;
  }
}

/// The names in "(const uint8_t* file, size_t size)".
std::vector<std::string> namesIn(std::string_view declaration) {
  std::vector<std::string> names;
  std::string name;
  for (const char c : declaration.substr(declaration.find('('))) {
    if (c == ',' || c == ')') {
      if (name != "void") names.push_back(name);
      name.clear();
    } else if (std::isalnum(static_cast<unsigned char>(c)) != 0 || c == '_') {
      name += c;
    } else {
      name.clear();
    }
  }
  return names;
}

int calls = 0;

/// Whether results are what a call that ended with `kind` leaves.
void judgeRoom(const Parameter& parameter, bool passed, std::int32_t kind) {
  const Room& room = parameter.room;
  if (room.before.empty() || kind == QUENBY_OK) return;
  if (kind == QUENBY_CANCELLED && parameter.function == "quenby_session_apply") return;
  const bool isCleared = passed && (room.isObject || parameter.name == "count");
  const std::size_t size = room.before.size() - 4096;
  const std::size_t cleared = isCleared ? (size / 4) : 0;
  for (std::size_t i = 0; i < room.now.size(); ++i) {
    ASSERT_EQ(room.now[i], i < cleared ? 0 : room.before[i])
        << parameter.function << ": " << parameter.name << " after " << error.message;
  }
}

template <typename Result, typename... A, std::size_t... place>
void tryFunction(const char* name, const char* declaration, Result (*function)(A...),
                 std::index_sequence<place...>) {
  SCOPED_TRACE(name);
  constexpr bool canFail =
      std::is_same_v<Result, std::int32_t> && (std::is_same_v<A, quenby_error*> || ...);
  const std::vector<std::string> names = namesIn(declaration);
  ASSERT_EQ(names.size(), sizeof...(A)) << declaration;
  std::array<Parameter, sizeof...(A)> parameters = {Parameter{name, names[place]}...};
  const std::tuple<std::vector<Choice<A>>...> lists = {choices<A>(parameters[place])...};
  const std::array<std::size_t, sizeof...(A)> counts = {std::get<place>(lists).size()...};

  using Selection = std::array<std::size_t, sizeof...(A)>;
  const auto call = [&](const Selection& chosen, Meaning wanted) {
    ++calls;
    for (Parameter& parameter : parameters) parameter.room.reset();
    error.kind = -1;
    std::memset(error.message, 'x', sizeof(error.message));
    if constexpr (canFail) {
      const std::int32_t kind = function(std::get<place>(lists)[chosen[place]].value...);
      std::string arguments;
      for (std::size_t i = 0; i < chosen.size(); ++i) {
        arguments += names[i] + '#' + std::to_string(chosen[i]) + ' ';
      }
      SCOPED_TRACE(arguments);
      ASSERT_GE(kind, QUENBY_OK);
      ASSERT_LE(kind, QUENBY_FAILED);
      if (chosen[sizeof...(A) - 1] == 0) {  // the error
        ASSERT_EQ(error.kind, kind);
        ASSERT_NE(std::memchr(error.message, 0, sizeof(error.message)), nullptr);
        ASSERT_EQ(error.message[0] == 0, kind == QUENBY_OK);
      }
      if (wanted == Meaning::right) {
        ASSERT_EQ(kind, QUENBY_OK) << error.message;
      }
      if (wanted == Meaning::wrong) {
        ASSERT_EQ(kind, QUENBY_INVALID_ARGUMENT) << error.message;
      }
      (judgeRoom(parameters[place], chosen[place] == 0, kind), ...);
      for (Parameter& parameter : parameters) {
        if (kind == QUENBY_OK && parameter.room.release)
          parameter.room.release(parameter.room.now.data());
      }
    } else {
      static_cast<void>(function(std::get<place>(lists)[chosen[place]].value...));
    }
  };

  const std::string_view text = name;
  if (text.ends_with("_free")) {  // objects are freed where they are made
    call({1}, Meaning::either);
    return;
  }
  call({}, Meaning::right);
  const auto meanings = [&](std::size_t parameter, std::size_t choice) {
    Meaning meaning = Meaning::either;
    ((parameter == place ? void(meaning = std::get<place>(lists)[choice].meaning) : void()), ...);
    return meaning;
  };
  for (std::size_t i = 0; i < sizeof...(A); ++i) {
    for (std::size_t choice = 1; choice < counts[i]; ++choice) {
      Selection chosen{};
      chosen[i] = choice;
      call(chosen, meanings(i, choice));
    }
  }
  std::mt19937 random(static_cast<unsigned>(sizeof...(A)) + 7);
  for (int round = 0; sizeof...(A) > 2 && round < 24; ++round) {
    Selection chosen{};
    for (std::size_t i = 0; i < sizeof...(A); ++i) {
      if (random() % 2 == 0) chosen[i] = random() % counts[i];
    }
    call(chosen, Meaning::either);
  }
  call({}, Meaning::right);
}

template <typename Result, typename... A>
void tryFunction(const char* name, const char* declaration, Result (*function)(A...)) {
  if constexpr (sizeof...(A) == 0) {
    ++calls;
    static_cast<void>(function());
  } else {
    tryFunction(name, declaration, function, std::index_sequence_for<A...>());
  }
}

class Arguments : public testing::Test {
 protected:
  void SetUp() override {
    quenby_open_options asStored{};
    asStored.struct_size = sizeof(asStored);
    asStored.flags = QUENBY_AS_STORED;
    DONE(quenby_photo_open(jpeg().data(), jpeg().size(), &asStored, nullptr,
                           &Pool<quenby_photo>::shared, &error));
    shareFileWithALoss();
    DONE(quenby_session_open(&rightPixels(), nullptr, 0, 0, &Pool<quenby_session>::shared, &error));
    DONE(quenby_cancel_new(&Pool<quenby_cancel>::shared, &error));
    DONE(quenby_cancel_new(&requested, &error));
    quenby_cancel_request(requested);
    DONE(quenby_threads_new(2, &Pool<quenby_threads>::shared, &error));
    ASSERT_EQ(failures, 0);
  }

  static void shareFileWithALoss() {
    const std::uint8_t translucent[] = {9, 9, 9, 9};
    const quenby_pixels pixels = {translucent, 1, 1, 4};
    quenby_file* png = nullptr;
    quenby_photo* photo = nullptr;
    DONE(quenby_write(&pixels, "PNG", nullptr, nullptr, &png, &error));
    DONE(quenby_photo_open(quenby_file_data(png), quenby_file_size(png), nullptr, nullptr, &photo,
                           &error));
    DONE(quenby_photo_save(photo, nullptr, "JPEG", nullptr, nullptr, &Pool<quenby_file>::shared,
                           &error));
    quenby_photo_free(photo);
    quenby_file_free(png);
  }

  void TearDown() override {
    quenby_photo_free(Pool<quenby_photo>::shared);
    quenby_file_free(Pool<quenby_file>::shared);
    quenby_session_free(Pool<quenby_session>::shared);
    quenby_cancel_free(Pool<quenby_cancel>::shared);
    quenby_cancel_free(requested);
    quenby_threads_free(Pool<quenby_threads>::shared);
  }
};

TEST_F(Arguments, OfEveryFunctionAreRefusedOrServed) {
  struct Row {
    const char* name;
    std::function<void()> run;
  };
  const Row rows[] = {
#define FUNCTION(name, declaration) {#name, [] { tryFunction(#name, declaration, name); }},
#include "header_functions.h"
#undef FUNCTION
  };
  for (const Row& row : rows) {
    if (std::string_view(row.name) != "quenby_cancel_request") row.run();
    if (HasFatalFailure()) return;
  }
  for (const Row& row : rows) {  // after which nothing else is done with that object
    if (std::string_view(row.name) == "quenby_cancel_request") row.run();
  }
  std::printf("%zu functions, %d calls\n", std::size(rows), calls);
  EXPECT_GE(std::size(rows), 49u);
  EXPECT_GE(calls, 1300);
}

}  // namespace
