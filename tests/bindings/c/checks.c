#include "checks.h"

#include <stdio.h>
#include <stdlib.h>
#include <string.h>

int failures = 0;
quenby_error error;

void check(int holds, const char* text, const char* file, int line) {
  if (holds) return;
  ++failures;
  fprintf(stderr, "%s:%d: does not hold: %s\n", file, line, text);
}

void done(int32_t kind, const char* text, const char* file, int line) {
  if (kind == QUENBY_OK && error.kind == QUENBY_OK && error.message[0] == 0) return;
  ++failures;
  fprintf(stderr, "%s:%d: %s is %d: %s\n", file, line, text, kind, error.message);
}

void refused(int32_t wanted, int32_t kind, const char* text, const char* file, int line) {
  if (kind == wanted && error.kind == wanted && error.message[0] != 0) return;
  ++failures;
  fprintf(stderr, "%s:%d: %s is %d, not %d: %s\n", file, line, text, kind, wanted, error.message);
}

quenby_pixels made_pixels(uint32_t width, uint32_t height, unsigned seed) {
  uint8_t* const rgba = malloc((size_t)width * height * 4);
  unsigned noise = seed * 2654435761u + 1;
  for (uint32_t y = 0; y < height; ++y) {
    for (uint32_t x = 0; x < width; ++x) {
      uint8_t* const pixel = rgba + 4 * ((size_t)y * width + x);
      noise = noise * 1664525u + 1013904223u;
      const unsigned light =
          40 + 120 * x / width + (x / 12 % 2) * (y / 12 % 2) * 40 + (noise >> 28);
      pixel[0] = (uint8_t)light;
      pixel[1] = (uint8_t)(light / 2 + 90 * y / height);
      pixel[2] = (uint8_t)(200 - light / 2);
      pixel[3] = 255;
    }
  }
  const quenby_pixels pixels = {rgba, width, height, (size_t)width * 4};
  return pixels;
}

void free_pixels(quenby_pixels* pixels) {
  free((void*)(uintptr_t)pixels->rgba);
  pixels->rgba = NULL;
}

/* Orientation 6 and the time 2024-05-01 12:30:45. */
static const uint8_t exif[] = {'E', 'x', 'i',  'f',  0,   0,   'I', 'I', 42,  0,   8,   0,   0,
                               0,   2,   0,    0x12, 1,   3,   0,   1,   0,   0,   0,   6,   0,
                               0,   0,   0x32, 1,    2,   0,   20,  0,   0,   0,   38,  0,   0,
                               0,   0,   0,    0,    0,   '2', '0', '2', '4', ':', '0', '5', ':',
                               '0', '1', ' ',  '1',  '2', ':', '3', '0', ':', '4', '5', 0};

static const char xmp[] =
    "http://ns.adobe.com/xap/1.0/\0<x:xmpmeta xmlns:x='adobe:ns:meta/'><rdf:RDF "
    "xmlns:rdf='http://www.w3.org/1999/02/22-rdf-syntax-ns#'><rdf:Description rdf:about='' "
    "xmlns:mwg-rs='http://www.metadataworkinggroup.com/schemas/regions/' "
    "xmlns:stArea='http://ns.adobe.com/xmp/sType/Area#' "
    "xmlns:stDim='http://ns.adobe.com/xap/1.0/sType/Dimensions#'>"
    "<mwg-rs:Regions rdf:parseType='Resource'>"
    "<mwg-rs:AppliedToDimensions stDim:w='200' stDim:h='150' stDim:unit='pixel'/>"
    "<mwg-rs:RegionList><rdf:Bag><rdf:li><rdf:Description mwg-rs:Type='Face' "
    "mwg-rs:Name='Ada'><mwg-rs:Area stArea:x='0.4' stArea:y='0.5' stArea:w='0.5' stArea:h='0.6' "
    "stArea:unit='normalized'/></rdf:Description></rdf:li></rdf:Bag></mwg-rs:RegionList>"
    "</mwg-rs:Regions></rdf:Description></rdf:RDF></x:xmpmeta>";

static uint8_t* put_segment(uint8_t* to, uint8_t marker, const void* payload, size_t size) {
  const uint8_t head[] = {0xFF, marker, (uint8_t)((size + 2) >> 8), (uint8_t)(size + 2)};
  memcpy(to, head, 4);
  memcpy(to + 4, payload, size);
  return to + 4 + size;
}

struct bytes made_photo(uint32_t width, uint32_t height, unsigned seed) {
  quenby_pixels pixels = made_pixels(width, height, seed);
  quenby_file* plain = NULL;
  DONE(quenby_write(&pixels, "JPEG", NULL, NULL, &plain, &error));
  free_pixels(&pixels);
  const uint8_t* const from = quenby_file_data(plain);
  const size_t size = quenby_file_size(plain);
  struct bytes file = {malloc(size + 2000), 0};
  memcpy(file.data, from, 2);
  uint8_t* at = put_segment(file.data + 2, 0xE1, exif, sizeof(exif));
  at = put_segment(at, 0xE1, xmp, sizeof(xmp) - 1);
  at = put_segment(at, 0xFE, "hello", 5);
  memcpy(at, from + 2, size - 2);
  file.size = (size_t)(at - file.data) + size - 2;
  quenby_file_free(plain);
  return file;
}

struct bytes read_bytes(const char* path) {
  struct bytes file = {NULL, 0};
  FILE* const stream = fopen(path, "rb");
  if (stream == NULL) return file;
  fseek(stream, 0, SEEK_END);
  file.size = (size_t)ftell(stream);
  rewind(stream);
  file.data = malloc(file.size + 1);
  if (fread(file.data, 1, file.size, stream) != file.size) file.size = 0;
  fclose(stream);
  return file;
}

void write_bytes(const char* path, const uint8_t* data, size_t size) {
  FILE* const stream = fopen(path, "wb");
  CHECK(stream != NULL && fwrite(data, 1, size, stream) == size);
  if (stream != NULL) fclose(stream);
}
