#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "photo/file_io.h"

namespace pelorin::imgproc {

/// What the codec sees of a stream.
class StreamFile {
 public:
  enum class Mode { read, write };

  /// Reads the file, for `Mode::read`.
  /// @throws std::system_error when it cannot be read.
  StreamFile(std::string path, Mode mode);

  /// What was read.
  std::span<const std::uint8_t> content() const { return content_; }

  /// Writes the whole content, beside the file until `close`; pipes and devices get it now.
  /// @throws std::system_error when it cannot be written.
  void write(std::span<const std::uint8_t> bytes);

  /// Puts what was written in place of the file, if anything was.
  /// @throws std::system_error when that fails; the file is then as it was.
  void close();

 private:
  std::string path_;
  std::vector<std::uint8_t> content_;
  std::optional<photo::Replacement> written_;
};

}  // namespace pelorin::imgproc
