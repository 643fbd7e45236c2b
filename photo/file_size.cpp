#include "photo/file_size.h"

#include <string>

#include "photo/photo_error.h"

namespace pelorin::photo {

void refuseFileSize(std::uint64_t mostBytes) {
  constexpr int bitsOfMiB = 20;
  const bool wholeMiB = mostBytes % (std::uint64_t{1} << bitsOfMiB) == 0;
  throw PhotoError(PhotoError::Kind::tooLarge,
                   "is larger than " +
                       (wholeMiB ? std::to_string(mostBytes >> bitsOfMiB) + " MiB"
                                 : std::to_string(mostBytes) + " bytes") +
                       ", the most that is read of a file");
}

void checkFileSize(std::uint64_t bytes, const DecodeLimits& limits) {
  if (bytes > limits.bytes) refuseFileSize(limits.bytes);
}

}  // namespace pelorin::photo
