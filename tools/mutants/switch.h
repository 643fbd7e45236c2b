#pragma once

/// Asks which mutant a program is. Included by mutants.py into a copy of the sources alone.
///
/// QUENBY_MUTANT is the number of the one; none for the program as it is. QUENBY_MUTANTS_REACHED is the
/// beginning of file names: at its end the program writes there which numbers it asked for.

#include <unistd.h>

#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <string>

namespace quenby_mutants {

inline constexpr int most = 32768;
inline int chosen = -1;
inline bool recording = false;  // what is asked for, which takes time where threads share it
inline std::atomic<bool> reached[most];

struct Run {
  Run() {
    if (const char* number = std::getenv("QUENBY_MUTANT")) chosen = std::atoi(number);
    recording = std::getenv("QUENBY_MUTANTS_REACHED") != nullptr;
  }
  ~Run() {
    const char* name = std::getenv("QUENBY_MUTANTS_REACHED");
    if (name == nullptr) return;
    // Every library of a program may have a list of its own.
    const std::string path = name + std::to_string(getpid()) + "." +
                             std::to_string(reinterpret_cast<unsigned long>(reached));
    std::FILE* file = std::fopen(path.c_str(), "w");
    if (file == nullptr) return;
    for (int number = 0; number < most; ++number)
      if (reached[number].load(std::memory_order_relaxed)) std::fprintf(file, "%d\n", number);
    std::fclose(file);
  }
};
inline Run run __attribute__((init_priority(101)));

}  // namespace quenby_mutants

/// False in what is computed while compiling, which no switch can change.
constexpr bool quenbyMutant(int number) {
  if (__builtin_is_constant_evaluated()) return false;
  if (quenby_mutants::recording && !quenby_mutants::reached[number].load(std::memory_order_relaxed))
    quenby_mutants::reached[number].store(true, std::memory_order_relaxed);
  return number == quenby_mutants::chosen;
}
