// Preloaded into a command, makes one of its calls to the system fail, or the one and all after it:
// QUENBY_FAULT="KIND NUMBER HOW", where HOW is an errno, `short` for half of what was asked for, or
// for memory `later` when all after it fail too. QUENBY_FAULT_COUNTS names a file for how many calls
// of each kind there were.
#include <dlfcn.h>
#include <fcntl.h>
#include <stdarg.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <sys/uio.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace {

enum Kind { memory, reading, writing, opening, closing, renaming, syncing, mapping, asking };
constexpr const char* kindNames[] = {"memory", "read", "write", "open", "close",
                                     "rename", "sync", "map",   "stat"};
constexpr int kinds = sizeof(kindNames) / sizeof(*kindNames);

struct {
  bool active;
  int kind;
  long number;
  int error;
  bool later, shorter;
} plan = {false, -1, 0, 0, false, false};
std::atomic<long> counts[kinds];

/// Whether this call of a kind is the one; sets errno.
bool isChosen(Kind kind) {
  if (!plan.active) return false;
  const long number = ++counts[kind];
  const bool chosen = kind == plan.kind && plan.number > 0 &&
                      (number == plan.number || (plan.later && number > plan.number));
  if (chosen) errno = plan.error;
  return chosen;
}

[[gnu::constructor]] void start() {
  if (const char* const text = std::getenv("QUENBY_FAULT")) {
    char kind[16] = "", how[16] = "";
    if (std::sscanf(text, "%15s %ld %15s", kind, &plan.number, how) != 3) std::abort();
    for (int i = 0; i < kinds; ++i)
      if (std::strcmp(kind, kindNames[i]) == 0) plan.kind = i;
    plan.later = std::strcmp(how, "later") == 0;
    plan.shorter = std::strcmp(how, "short") == 0;
    plan.error = plan.kind == memory ? ENOMEM : std::atoi(how);
    plan.active = true;
  }
}

[[gnu::destructor]] void finish() {
  plan.active = false;
  const char* const path = std::getenv("QUENBY_FAULT_COUNTS");
  std::FILE* const file = path == nullptr ? nullptr : std::fopen(path, "w");
  if (file == nullptr) return;
  for (int i = 0; i < kinds; ++i) std::fprintf(file, "%s %ld\n", kindNames[i], counts[i].load());
  std::fclose(file);
}

template <typename Function>
Function* original(Function*, const char* name) {
  return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}

std::size_t half(std::size_t size) {
  return size > 1 ? size / 2 : size;
}

}  // namespace

#define ORIGINAL(function) static auto* const real = original(&function, #function)

#pragma GCC visibility push(default)  // what is hidden takes nobody's place
extern "C" {

void* __libc_malloc(std::size_t size);
void* __libc_calloc(std::size_t count, std::size_t size);
void* __libc_realloc(void* block, std::size_t size);
void* __libc_memalign(std::size_t alignment, std::size_t size);

void* malloc(std::size_t size) {
  return isChosen(memory) ? nullptr : __libc_malloc(size);
}
void* calloc(std::size_t count, std::size_t size) {
  return isChosen(memory) ? nullptr : __libc_calloc(count, size);
}
void* realloc(void* block, std::size_t size) {
  return isChosen(memory) ? nullptr : __libc_realloc(block, size);
}
void* memalign(std::size_t alignment, std::size_t size) {
  return isChosen(memory) ? nullptr : __libc_memalign(alignment, size);
}
void* aligned_alloc(std::size_t alignment, std::size_t size) {
  return memalign(alignment, size);
}
int posix_memalign(void** block, std::size_t alignment, std::size_t size) {
  *block = memalign(alignment, size);
  return *block == nullptr ? ENOMEM : 0;
}

ssize_t read(int file, void* bytes, std::size_t size) {
  ORIGINAL(read);
  if (!isChosen(reading)) return real(file, bytes, size);
  return plan.shorter ? real(file, bytes, half(size)) : -1;
}
ssize_t pread64(int file, void* bytes, std::size_t size, off64_t at) {
  ORIGINAL(pread64);
  if (!isChosen(reading)) return real(file, bytes, size, at);
  return plan.shorter ? real(file, bytes, half(size), at) : -1;
}
ssize_t write(int file, const void* bytes, std::size_t size) {
  ORIGINAL(write);
  if (!isChosen(writing)) return real(file, bytes, size);
  return plan.shorter ? real(file, bytes, half(size)) : -1;
}
ssize_t pwrite64(int file, const void* bytes, std::size_t size, off64_t at) {
  ORIGINAL(pwrite64);
  if (!isChosen(writing)) return real(file, bytes, size, at);
  return plan.shorter ? real(file, bytes, half(size), at) : -1;
}
ssize_t writev(int file, const struct iovec* parts, int count) {
  ORIGINAL(writev);
  if (!isChosen(writing)) return real(file, parts, count);
  return plan.shorter ? real(file, parts, count > 1 ? 1 : count) : -1;
}

#define OPENS(function)                                                     \
  int function(const char* path, int flags, ...) {                          \
    ORIGINAL(function);                                                     \
    va_list rest;                                                           \
    va_start(rest, flags);                                                  \
    const int mode = flags & (O_CREAT | O_TMPFILE) ? va_arg(rest, int) : 0; \
    va_end(rest);                                                           \
    return isChosen(opening) ? -1 : real(path, flags, mode);                \
  }
OPENS(open)
OPENS(open64)
#define OPENS_AT(function)                                                  \
  int function(int folder, const char* path, int flags, ...) {              \
    ORIGINAL(function);                                                     \
    va_list rest;                                                           \
    va_start(rest, flags);                                                  \
    const int mode = flags & (O_CREAT | O_TMPFILE) ? va_arg(rest, int) : 0; \
    va_end(rest);                                                           \
    return isChosen(opening) ? -1 : real(folder, path, flags, mode);        \
  }
OPENS_AT(openat)
OPENS_AT(openat64)
std::FILE* fopen(const char* path, const char* mode) {
  ORIGINAL(fopen);
  return isChosen(opening) ? nullptr : real(path, mode);
}
std::FILE* fopen64(const char* path, const char* mode) {
  ORIGINAL(fopen64);
  return isChosen(opening) ? nullptr : real(path, mode);
}

int close(int file) {
  ORIGINAL(close);
  const bool chosen = isChosen(closing);
  const int result = real(file);
  if (chosen) errno = plan.error;
  return chosen ? -1 : result;
}
int rename(const char* from, const char* to) {
  ORIGINAL(rename);
  return isChosen(renaming) ? -1 : real(from, to);
}
int renameat2(int fromFolder, const char* from, int toFolder, const char* to, unsigned flags) {
  ORIGINAL(renameat2);
  return isChosen(renaming) ? -1 : real(fromFolder, from, toFolder, to, flags);
}
int link(const char* from, const char* to) {
  ORIGINAL(link);
  return isChosen(renaming) ? -1 : real(from, to);
}
int fsync(int file) {
  ORIGINAL(fsync);
  return isChosen(syncing) ? -1 : real(file);
}
int fdatasync(int file) {
  ORIGINAL(fdatasync);
  return isChosen(syncing) ? -1 : real(file);
}
void* mmap(void* at, std::size_t size, int protection, int flags, int file, off_t from) {
  ORIGINAL(mmap);
  return isChosen(mapping) ? MAP_FAILED : real(at, size, protection, flags, file, from);
}
void* mmap64(void* at, std::size_t size, int protection, int flags, int file, off64_t from) {
  ORIGINAL(mmap64);
  return isChosen(mapping) ? MAP_FAILED : real(at, size, protection, flags, file, from);
}
int stat(const char* path, struct stat* facts) {
  ORIGINAL(stat);
  return isChosen(asking) ? -1 : real(path, facts);
}
int lstat(const char* path, struct stat* facts) {
  ORIGINAL(lstat);
  return isChosen(asking) ? -1 : real(path, facts);
}
int fstat(int file, struct stat* facts) {
  ORIGINAL(fstat);
  return isChosen(asking) ? -1 : real(file, facts);
}
int stat64(const char* path, struct stat64* facts) {
  ORIGINAL(stat64);
  return isChosen(asking) ? -1 : real(path, facts);
}
int lstat64(const char* path, struct stat64* facts) {
  ORIGINAL(lstat64);
  return isChosen(asking) ? -1 : real(path, facts);
}
int fstat64(int file, struct stat64* facts) {
  ORIGINAL(fstat64);
  return isChosen(asking) ? -1 : real(file, facts);
}
int fstatat64(int folder, const char* path, struct stat64* facts, int flags) {
  ORIGINAL(fstatat64);
  return isChosen(asking) ? -1 : real(folder, path, facts, flags);
}
}
