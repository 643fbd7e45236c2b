// The header is C++ as well, whatever its standard; and a program whose containers are those of the C++
// library's debug mode, which no Quenby in C++ would link with, has the same pixels.
#include <quenby/quenby.h>

#include <algorithm>
#include <vector>

#ifndef _GLIBCXX_DEBUG
#error "this is about debug containers"
#endif

int main() {
  const uint32_t width = 64, height = 48;
  std::vector<uint8_t> photo(width * height * 4, 99), result(photo.size(), 0), file;
  const quenby_pixels pixels = {&photo[0], width, height, width * 4};
  quenby_session* session = 0;
  quenby_error error;
  if (quenby_abi() != QUENBY_ABI) return 1;
  if (quenby_session_open(&pixels, 0, 0, 0, &session, &error) != QUENBY_OK) return 2;
  if (quenby_session_apply(session, "PassThrough", 0, &result[0], width * 4, 0, &error) !=
      QUENBY_OK)
    return 3;
  quenby_session_free(session);
  if (!std::equal(result.begin(), result.end(), photo.begin())) return 4;

  quenby_file* written = 0;
  if (quenby_write(&pixels, "PNG", 0, 0, &written, &error) != QUENBY_OK) return 5;
  file.assign(quenby_file_data(written), quenby_file_data(written) + quenby_file_size(written));
  quenby_file_free(written);
  quenby_photo* opened = 0;
  if (quenby_photo_open(&file[0], file.size(), 0, 0, &opened, &error) != QUENBY_OK) return 6;
  quenby_photo_free(opened);
  file.resize(file.size() / 2);
  if (quenby_photo_open(&file[0], file.size(), 0, 0, &opened, &error) != QUENBY_TRUNCATED) return 7;
  return 0;
}
