#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "cli/frame/inputs.h"
#include "cli/frame/talk.h"
#include "cli/frame/verb.h"
#include "photo/file_io.h"
#include "photo/photo.h"

namespace pelorin::cli {

/// Reads a photo, decodes it and turns it upright, within this run's limits and unless Ctrl-C comes
/// between. What a user should know of the photo is said, each thing once in a run.
/// @param spare  where the pixels of a decoded one may come from; may be null.
/// @throws what reading and decoding throw, for `explain`; Interrupted on Ctrl-C.
photo::Photo loadPhoto(const Input& input, photo::OpenOptions options, Talk& talk,
                       photo::SparePixels* spare = nullptr);

/// The options with this run's limits, and with what stops this thread: for reading a photo now.
photo::OpenOptions limited(photo::OpenOptions options);

/// Adds `--quality` to a verb.
void addQualityOption(Verb verb, int& quality);

struct SaveChoice {
  bool raw = false;  ///< As raw pixels, else in the format that the name says.
  const photo::Format* unnamed = &photo::usualFormat();  ///< Where the name says none.
  int quality = 90;
  photo::ColourDetail colour = photo::ColourDetail::usual;
  std::optional<photo::ChromaSampling> sampling = {};  ///< Else as the photo's own file.
  photo::KeepOptions keep = {};
  std::optional<photo::EditMark> mark = {};
  bool strict = false;  ///< Fail where metadata would be lost.
  photo::ReplaceOptions replace = {};
  std::string backup = {};  ///< The folder that keeps what is replaced; empty for none.
};

/// For plots and drawings: without loss where the name says no format, thin lines in full colour.
/// @param overwrite  whether they may replace a file.
SaveChoice drawing(bool overwrite);

/// The format of a file called `path`, which says it by its extension.
const photo::Format& outputFormat(const std::string& path, const SaveChoice& choice);

/// Refuses a name whose extension is no format, or another than what is written; names without an
/// extension, "-" and special files (/dev/null) pass.
/// @param raw  whether raw pixels are written, else a picture.
/// @throws UsageError.
void requireFormatOf(const std::string& path, bool raw);

/// How a picture becomes a file; stops on Ctrl-C.
photo::SaveOptions saveOptions(const SaveChoice& choice);

/// Writes a finished file, or standard output.
/// @param lost  what of the metadata is not in it.
/// @throws what writing throws, and where nothing may be lost; an old file is then as it was.
void writePhoto(const std::string& path, const photo::FileView& file,
                const std::vector<photo::Loss>& lost, const SaveChoice& choice);

/// Says what a photo's file makes a user wonder about.
void tellNotices(const Input& input, const photo::PhotoFacts& facts, Talk& talk);

/// Writes a picture to a file or standard output, in the format of `outputFormat`.
/// @returns what is lost of the metadata.
/// @throws what encoding and writing throw, Interrupted on Ctrl-C; an old file is then as it was.
std::vector<photo::Loss> savePicture(
    const std::string& path, const image_processing::Image<image_processing::RGBA8Pixel>& picture,
    const photo::Metadata& metadata, const SaveChoice& choice);

}  // namespace pelorin::cli
