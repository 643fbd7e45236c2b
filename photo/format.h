#pragma once

#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <string_view>

#include "photo/file_view.h"
#include "photo/options.h"
#include "photo/rows.h"

namespace pelorin::photo {

/// What there is to know of a kind of file.
struct Format {
  std::string_view name;                         ///< "JPEG"
  std::span<const std::string_view> extensions;  ///< ".jpg" first: what results are called.
  bool scalesWhileDecoding;                      ///< Otherwise the scaling follows.
  bool keepsAlpha;
  bool losesDetail;  ///< How much, `SaveOptions::quality` says.

  /// Whether bytes begin as a file of this format does.
  bool (*recognises)(std::span<const std::uint8_t> file);

  /// Whether a file that begins so can be read where the rest of it is elsewhere.
  bool (*mayBePart)(std::span<const std::uint8_t> first);

  /// @param file  outlives the reader; with a rest where `mayBePart` says so.
  /// @throws PhotoError when the file is damaged or beyond the limits: before anything of the
  ///         picture's size is allocated. What reading the rest throws.
  std::unique_ptr<RowReader> (*reader)(const FileView& file, const OpenOptions& options);

  /// Takes out what a file of this format cannot hold, and names it among the losses.
  void (*removeForeign)(KeptMetadata& kept);

  /// @param hasAlpha  whether any pixel is not opaque; without effect unless `keepsAlpha`.
  /// @param source    of the photo that the picture is made of: what its file is coded like.
  /// @throws PhotoError when the format cannot hold a picture of this size.
  std::unique_ptr<RowWriter> (*writer)(PictureSize size, bool hasAlpha, const SaveOptions& options,
                                       const Metadata& source);
};

/// All formats that can be read and written. A new one is a row here and a folder beside this.
std::span<const Format> formats();

/// The one of packed RGBA bytes, which nothing in a file tells.
const Format& rawPixels();

/// What a picture is written in where nothing says it.
const Format& usualFormat();

/// The format that some bytes are in.
/// @throws PhotoError when they are none; a known kind that cannot be read is named, and how to
///         convert it.
const Format& formatOf(std::span<const std::uint8_t> file);

/// @returns null when there is no format with this name, such as "JPEG".
const Format* formatNamed(std::string_view name);

/// @param extension  with its dot, in any case: ".JPG".
/// @returns null when no format has it.
const Format* formatWithExtension(std::string_view extension);

/// Whether pictures, not raw pixels, are called so.
bool isPictureExtension(std::string_view extension);

/// "JPEG or PNG": the formats of pictures, for messages and help.
std::string pictureFormats();

/// ".jpg, .jpeg, .jpe or .png"
std::string pictureExtensions();

/// "JPEG": those that `SaveOptions::quality` is for.
std::string lossyFormats();

}  // namespace pelorin::photo
