#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "cli/frame/inputs.h"
#include "photo/file_io.h"
#include "photo/long_file.h"
#include "photo/options.h"

namespace pelorin::cli {

/// All bytes of a file or of standard input, the one place where inputs are read: no more of them than
/// `limits` allow.
/// @throws as `photo::readFile`; Interrupted on Ctrl-C while waiting.
std::vector<std::uint8_t> readInput(const Input& input);

/// The same of a photo, without what of a long file can be read when it is wanted.
photo::OpenedFile openInput(const Input& input, const photo::OpenOptions& options);

/// Writes a file in one step, old or new and never half; "-" and special files (/dev/null, a named
/// pipe) are written as they come.
/// @param backup  the folder that keeps a file that is replaced; empty for none.
/// @throws FileError, naming the file, when it cannot be written, or is there and may not be
///         replaced; an old file is then as it was.
void writeOutput(const std::string& path, const photo::FileView& bytes,
                 const photo::ReplaceOptions& options, const std::string& backup = {});

}  // namespace pelorin::cli
