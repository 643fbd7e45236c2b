/* What the C programs here have in common: checks that count, and pictures and files to work on. */
#ifndef QUENBY_TESTS_BINDINGS_C_CHECKS_H
#define QUENBY_TESTS_BINDINGS_C_CHECKS_H

#include <quenby/quenby.h>

extern int failures;

/* Says so and goes on when a condition does not hold. */
#define CHECK(condition) check((condition) != 0, #condition, __FILE__, __LINE__)

/* A call that must succeed, and one that must end with this kind and say why. */
#define DONE(call) done((call), #call, __FILE__, __LINE__)
#define REFUSED(kind, call) refused((kind), (call), #call, __FILE__, __LINE__)

void check(int holds, const char* text, const char* file, int line);
void done(int32_t kind, const char* text, const char* file, int line);
void refused(int32_t wanted, int32_t kind, const char* text, const char* file, int line);

/* For calls within DONE and REFUSED, which look at it. */
extern quenby_error error;

struct bytes {
  uint8_t* data;
  size_t size;
};

/* Something like a photo; pixels of `width` times `height` in memory of malloc. */
quenby_pixels made_pixels(uint32_t width, uint32_t height, unsigned seed);
void free_pixels(quenby_pixels* pixels);

/* A JPEG file of such a picture that is to be turned clockwise, with a comment, a capture time and a
 * face that its XMP knows of. */
struct bytes made_photo(uint32_t width, uint32_t height, unsigned seed);

struct bytes read_bytes(const char* path);
void write_bytes(const char* path, const uint8_t* data, size_t size);

#endif
