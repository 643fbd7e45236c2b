#include "platform/pn_imgproc/stream_file.h"

#include <utility>

namespace pelorin::imgproc {

StreamFile::StreamFile(std::string path, Mode mode) : path_(std::move(path)) {
  if (mode == Mode::read) content_ = photo::readFile(path_);
}

void StreamFile::write(std::span<const std::uint8_t> bytes) {
  written_.emplace(path_, bytes);
}

void StreamFile::close() {
  if (written_) written_->replace();
}

}  // namespace pelorin::imgproc
