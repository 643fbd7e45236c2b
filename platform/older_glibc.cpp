// Lets libraries that are linked here load where the C library is older, down to glibc 2.28, or the C++
// library, down to that of GCC 11. What was given a new name or a new version since then is asked for by
// the old one, or done without.
// A library's own definition comes before the C library's, and stays inside.
#include <pthread.h>
#include <sys/stat.h>
#include <unistd.h>

#include <condition_variable>
#include <cstdint>
#include <mutex>

#if defined(__x86_64__)
#define OLDEST "GLIBC_2.2.5"
constexpr int statVersion = 1;
#elif defined(__aarch64__)
#define OLDEST "GLIBC_2.17"
constexpr int statVersion = 0;
#elif defined(__arm__)
#define OLDEST "GLIBC_2.4"
constexpr int statVersion = 3;
#endif

// By name, since the compiler takes its built-in functions to be visible.
#define INSIDE(name) asm(".hidden " #name)
// old_<name> is <name> as it was first.
#define FIRST(name) asm(".symver old_" #name ", " #name "@" OLDEST)

extern "C" {

// 2.32. Some are never alone in a process, as in Java's: counting with atomics is always right.
INSIDE(__libc_single_threaded);
char __libc_single_threaded = 0;

// 2.36, from the C++ library's random device.
INSIDE(arc4random);
std::uint32_t arc4random() {
  std::uint32_t random;
  while (getentropy(&random, sizeof random) != 0) {
  }
  return random;
}

// 2.34, where the threads moved into the C library.
int old_pthread_once(pthread_once_t* control, void (*routine)());
FIRST(pthread_once);
int old_pthread_create(pthread_t* thread, const pthread_attr_t* attributes, void* (*routine)(void*),
                       void* argument);
int old_pthread_join(pthread_t thread, void** result);
int old_pthread_detach(pthread_t thread);
int old_pthread_key_create(pthread_key_t* key, void (*destroy)(void*));
int old_pthread_key_delete(pthread_key_t key);
void* old_pthread_getspecific(pthread_key_t key);
int old_pthread_setspecific(pthread_key_t key,
                            std::uintptr_t value);  // no pointer, for g++'s peace
FIRST(pthread_create);
FIRST(pthread_join);
FIRST(pthread_detach);
FIRST(pthread_key_create);
FIRST(pthread_key_delete);
FIRST(pthread_getspecific);
FIRST(pthread_setspecific);
INSIDE(pthread_once);
INSIDE(pthread_create);
INSIDE(pthread_join);
INSIDE(pthread_detach);
INSIDE(pthread_key_create);
INSIDE(pthread_key_delete);
INSIDE(pthread_getspecific);
INSIDE(pthread_setspecific);
int pthread_once(pthread_once_t* control, void (*routine)()) {
  return old_pthread_once(control, routine);
}
int pthread_create(pthread_t* thread, const pthread_attr_t* attributes, void* (*routine)(void*),
                   void* argument) {
  return old_pthread_create(thread, attributes, routine, argument);
}
int pthread_join(pthread_t thread, void** result) {
  return old_pthread_join(thread, result);
}
int pthread_detach(pthread_t thread) {
  return old_pthread_detach(thread);
}
int pthread_key_create(pthread_key_t* key, void (*destroy)(void*)) {
  return old_pthread_key_create(key, destroy);
}
int pthread_key_delete(pthread_key_t key) {
  return old_pthread_key_delete(key);
}
void* pthread_getspecific(pthread_key_t key) {
  return old_pthread_getspecific(key);
}
int pthread_setspecific(pthread_key_t key, const void* value) {
  return old_pthread_setspecific(key, reinterpret_cast<std::uintptr_t>(value));
}

// 2.33, before which the struct's version was told in every call. The functions for large files are
// others on 32-bit machines.
int old___xstat(int version, const char* path, struct stat* facts);
int old___lxstat(int version, const char* path, struct stat* facts);
int old___fxstat(int version, int file, struct stat* facts);
int old___xstat64(int version, const char* path, struct stat64* facts);
int old___lxstat64(int version, const char* path, struct stat64* facts);
int old___fxstat64(int version, int file, struct stat64* facts);
FIRST(__xstat);
FIRST(__lxstat);
FIRST(__fxstat);
FIRST(__xstat64);
FIRST(__lxstat64);
FIRST(__fxstat64);
INSIDE(stat);
INSIDE(lstat);
INSIDE(fstat);
INSIDE(stat64);
INSIDE(lstat64);
INSIDE(fstat64);
int stat(const char* path, struct stat* facts) {
  return old___xstat(statVersion, path, facts);
}
int lstat(const char* path, struct stat* facts) {
  return old___lxstat(statVersion, path, facts);
}
int fstat(int file, struct stat* facts) {
  return old___fxstat(statVersion, file, facts);
}
int stat64(const char* path, struct stat64* facts) {
  return old___xstat64(statVersion, path, facts);
}
int lstat64(const char* path, struct stat64* facts) {
  return old___lxstat64(statVersion, path, facts);
}
int fstat64(int file, struct stat64* facts) {
  return old___fxstat64(statVersion, file, facts);
}

// 2.29: the same arithmetic, from which the handling of errors by a global switch was taken.
double old_exp(double x);
double old_log(double x);
double old_pow(double x, double y);
FIRST(exp);
FIRST(log);
FIRST(pow);
INSIDE(exp);
INSIDE(log);
INSIDE(pow);
double exp(double x) {
  return old_exp(x);
}
double log(double x) {
  return old_log(x);
}
double pow(double x, double y) {
  return old_pow(x, y);
}
}

// A new version of GCC 12, the same function. Weak, for where the C++ library is linked in and has it.
asm(".hidden _ZNSt18condition_variable4waitERSt11unique_lockISt5mutexE");
__attribute__((weak)) void std::condition_variable::wait(std::unique_lock<std::mutex>& lock) {
  pthread_cond_wait(native_handle(), lock.mutex()->native_handle());
}
