/* Makes a photo better: uses_quenby IN OUT. Without arguments it makes a picture of its own. */
#include <quenby/quenby.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

static int enhance(const uint8_t* photo, size_t size, FILE* out) {
  quenby_error error;
  quenby_file* better = NULL;
  if (quenby_filter_file(photo, size, "AE0", "slider=0.4;", NULL, 0, NULL, NULL, NULL, NULL,
                         &better, &error) != QUENBY_OK) {
    fprintf(stderr, "%s\n", error.message);
    return 1;
  }
  if (out != NULL) fwrite(quenby_file_data(better), 1, quenby_file_size(better), out);
  printf("Quenby %s made %zu bytes of %zu\n", quenby_version(), quenby_file_size(better), size);
  quenby_file_free(better);
  return 0;
}

static int enhance_grey(void) {
  static uint8_t rgba[64 * 48 * 4];
  memset(rgba, 99, sizeof(rgba));
  const quenby_pixels pixels = {rgba, 64, 48, 64 * 4};
  quenby_file* photo = NULL;
  if (quenby_write(&pixels, "JPEG", NULL, NULL, &photo, NULL) != QUENBY_OK) return 1;
  const int failed = enhance(quenby_file_data(photo), quenby_file_size(photo), NULL);
  quenby_file_free(photo);
  return failed;
}

int main(int argc, char** argv) {
  if (quenby_abi() != QUENBY_ABI) return 1;
  if (argc != 3) return enhance_grey();
  FILE* const in = fopen(argv[1], "rb");
  if (in == NULL || fseek(in, 0, SEEK_END) != 0) return 1;
  const size_t size = (size_t)ftell(in);
  rewind(in);
  uint8_t* const photo = malloc(size);
  if (photo == NULL || fread(photo, 1, size, in) != size) return 1;
  fclose(in);
  FILE* const out = fopen(argv[2], "wb");
  if (out == NULL) return 1;
  const int failed = enhance(photo, size, out);
  free(photo);
  return fclose(out) != 0 || failed;
}
