#include "bindings/c/photos.h"

#include <limits>
#include <memory>
#include <optional>
#include <set>
#include <utility>

#include "bindings/c/pixels.h"
#include "bindings/c/workers.h"
#include "photo/collection/photo_record.h"
#include "photo/filter_photo.h"

using namespace pelorin;
using namespace pelorin::c_api;

namespace pelorin::c_api {

std::span<const std::uint8_t> bytesOf(const std::uint8_t* file, std::size_t size) {
  return {array(file, size, "file"), size};
}

photo::OpenOptions openOptions(const quenby_open_options* given, const quenby_cancel* cancel) {
  const quenby_open_options options = optionsOf(given, "options");
  if ((options.flags & ~(QUENBY_AS_STORED | QUENBY_IGNORE_KNOWN_FACES)) != 0) {
    refuse("options", "unknown flags");
  }
  photo::OpenOptions open{.scale = options.scale == 0 ? 1 : options.scale,
                          .rotate = options.rotate,
                          .upright = (options.flags & QUENBY_AS_STORED) == 0,
                          .faces = (options.flags & QUENBY_IGNORE_KNOWN_FACES) == 0,
                          .stop = tokenOf(cancel)};
  if (open.scale != 1 && open.scale != 2 && open.scale != 4 && open.scale != 8) {
    refuse("scale", "is not 1, 2, 4 or 8");
  }
  if (open.rotate % 90 != 0) refuse("rotate", "is no multiple of 90");
  // Who names a number of pixels gets as many, also from a file that is small for them.
  if (options.max_pixels != 0)
    open.limits.pixels = open.limits.compressedPixels = options.max_pixels;
  if (options.max_scans < 0) refuse("max_scans", "is negative");
  if (options.max_scans != 0) open.limits.scans = options.max_scans;
  if (options.max_scanned_pixels != 0) open.limits.scannedPixels = options.max_scanned_pixels;
  if (options.max_compressed_pixels != 0)
    open.limits.compressedPixels = options.max_compressed_pixels;
  if (options.max_segments < 0) refuse("max_segments", "is negative");
  if (options.max_segments != 0) open.limits.segments = options.max_segments;
  if (options.max_bytes != 0) open.limits.bytes = options.max_bytes;
  return open;
}

}  // namespace pelorin::c_api

namespace {

std::set<photo::MetadataKind> kindsOf(uint32_t keep) {
  using Kind = photo::MetadataKind;
  constexpr std::pair<uint32_t, Kind> kinds[] = {
      {QUENBY_KEEP_COPYRIGHT, Kind::copyright}, {QUENBY_KEEP_TIME, Kind::time},
      {QUENBY_KEEP_EXIF, Kind::exif},           {QUENBY_KEEP_XMP, Kind::xmp},
      {QUENBY_KEEP_IPTC, Kind::iptc},           {QUENBY_KEEP_GAIN_MAP, Kind::gainMap}};
  std::set<Kind> kept;
  for (const auto& [bit, kind] : kinds) {
    if ((keep & bit) != 0) kept.insert(kind);
    keep &= ~bit;
  }
  if (keep != 0) refuse("options", "unknown kinds to keep");
  return kept;
}

std::optional<photo::ChromaSampling> samplingOf(uint32_t flags) {
  switch (flags & (QUENBY_SUBSAMPLING_444 | QUENBY_SUBSAMPLING_422 | QUENBY_SUBSAMPLING_420)) {
    case 0:
      return std::nullopt;
    case QUENBY_SUBSAMPLING_444:
      return photo::ChromaSampling{1, 1};
    case QUENBY_SUBSAMPLING_422:
      return photo::ChromaSampling{2, 1};
    case QUENBY_SUBSAMPLING_420:
      return photo::ChromaSampling{2, 2};
    default:
      refuse("options", "more than one subsampling");
  }
}

photo::SaveOptions saveOptions(const quenby_save_options* given, const quenby_cancel* cancel) {
  const quenby_save_options options = optionsOf(given, "options");
  const auto keeps = [&](uint32_t flag) { return (options.flags & flag) == 0; };
  if (options.flags >= 2 * QUENBY_SUBSAMPLING_420) refuse("options", "unknown flags");
  photo::SaveOptions save{.stop = tokenOf(cancel),
                          .keep = {.location = keeps(QUENBY_DROP_LOCATION),
                                   .thumbnail = keeps(QUENBY_DROP_THUMBNAIL),
                                   .gainMap = keeps(QUENBY_DROP_GAIN_MAP)}};
  if (!keeps(QUENBY_DROP_METADATA) || options.keep != 0) {
    save.keep.only = kindsOf(options.keep);
  }
  if (options.quality != 0) save.quality = options.quality;
  if (save.quality < 1 || save.quality > 100) refuse("quality", "is not from 1 to 100");
  if (!keeps(QUENBY_SOURCE_QUALITY)) save.quality = photo::sourceQuality;
  save.sampling = samplingOf(options.flags);
  return save;
}

bool wantsMark(const quenby_save_options* given) {
  return (optionsOf(given, "options").flags & QUENBY_NO_MARK) == 0;
}

const photo::Format& formatCalled(const char* name) {
  const photo::Format* const format = photo::formatNamed(&required(name, "format"));
  if (format == nullptr || format == &photo::rawPixels()) {
    refuse("format", std::string(name) + " is none that can be written");
  }
  return *format;
}

quenby_facts factsOf(const photo::PhotoFacts& from) {
  quenby_facts facts{};
  facts.width = from.width;
  facts.height = from.height;
  facts.channels = from.channels;
  facts.orientation = from.orientation;
  facts.progressive = from.progressive;
  facts.has_alpha = from.hasAlpha;
  copyText(facts.format, std::string(from.format));
  constexpr double unknown = std::numeric_limits<double>::quiet_NaN();
  facts.wall_clock = facts.utc = unknown;
  if (from.captureTime) {
    const photo::ShotTime time = photo::shotTime(*from.captureTime);
    facts.wall_clock = time.wallClock;
    facts.utc = time.utc.value_or(unknown);
    copyText(facts.capture_time, from.captureTime->text);
  }
  if (!from.edits.empty()) copyText(facts.last_edit, textOf(from.edits.back()));
  return facts;
}

}  // namespace

int32_t quenby_read_facts(const uint8_t* file, size_t size, quenby_facts* facts,
                          quenby_error* error) {
  return quenby_read_facts_within(file, size, nullptr, facts, error);
}

int32_t quenby_read_facts_within(const uint8_t* file, size_t size,
                                 const quenby_open_options* options, quenby_facts* facts,
                                 quenby_error* error) {
  return guarded(error, [&] {
    checkStructSize(required(facts, "facts"), "facts");
    const photo::DecodeLimits limits = openOptions(options, nullptr).limits;
    give(facts, factsOf(photo::readFacts(bytesOf(file, size), limits)), "facts");
  });
}

int32_t quenby_photo_open(const uint8_t* file, size_t size, const quenby_open_options* options,
                          const quenby_cancel* cancel, quenby_photo** photo, quenby_error* error) {
  if (photo != nullptr) *photo = nullptr;
  return guarded(error, [&] {
    required(photo, "photo");
    const photo::OpenOptions open = openOptions(options, cancel);
    *photo = new quenby_photo{photo::open(bytesOf(file, size), open), open.scale};
  });
}

void quenby_photo_free(quenby_photo* photo) {
  delete photo;
}

int32_t quenby_photo_pixels(const quenby_photo* photo, quenby_pixels* pixels, quenby_error* error) {
  return guarded(error, [&] {
    const Picture& picture = *required(photo, "photo").photo.image;
    required(pixels, "pixels") = {&picture.data.get()->r, picture.width, picture.height,
                                  size_t{picture.width} * picture.bytesPerPixel};
  });
}

int32_t quenby_photo_facts(const quenby_photo* photo, quenby_facts* facts, quenby_error* error) {
  return guarded(error,
                 [&] { give(facts, factsOf(required(photo, "photo").photo.facts), "facts"); });
}

int32_t quenby_photo_faces(const quenby_photo* photo, quenby_known_face* faces, size_t capacity,
                           size_t* count, quenby_error* error) {
  if (count != nullptr) *count = 0;
  return guarded(error, [&] {
    required(count, "count");
    array(faces, capacity, "faces");
    const std::vector<photo::KnownFace>& known = required(photo, "photo").photo.faces;
    for (size_t i = 0; i < known.size() && i < capacity; ++i) {
      faces[i] = {known[i].left, known[i].top, known[i].right, known[i].bottom, {}};
      copyText(faces[i].name, known[i].name);
    }
    *count = known.size();
  });
}

const char* quenby_photo_notice(const quenby_photo* photo, size_t index) {
  if (photo == nullptr || index >= photo->photo.facts.notices.size()) return nullptr;
  return photo->photo.facts.notices[index].c_str();
}

int32_t quenby_photo_save(const quenby_photo* photo, const quenby_pixels* pixels,
                          const char* format, const quenby_save_options* options,
                          const quenby_cancel* cancel, quenby_file** file, quenby_error* error) {
  if (file != nullptr) *file = nullptr;
  return guarded(error, [&] {
    required(file, "file");
    const photo::Photo& from = required(photo, "photo").photo;
    const photo::SaveOptions save = saveOptions(options, cancel);
    const photo::Format& as =
        format == nullptr ? *photo::formatNamed(from.facts.format) : formatCalled(format);
    const auto picture = pixels == nullptr ? from.image : viewOf(pixels);
    if (picture->width != from.image->width || picture->height != from.image->height) {
      refuse("pixels", "are of another size than the photo's");
    }
    auto made = std::make_unique<quenby_file>();
    made->bytes = photo::save(*picture, as, from.metadata, save, &made->lost);
    *file = made.release();
  });
}

int32_t quenby_write(const quenby_pixels* pixels, const char* format,
                     const quenby_save_options* options, const quenby_cancel* cancel,
                     quenby_file** file, quenby_error* error) {
  if (file != nullptr) *file = nullptr;
  return guarded(error, [&] {
    required(file, "file");
    const photo::SaveOptions save = saveOptions(options, cancel);
    const photo::Format& as = formatCalled(format);
    auto made = std::make_unique<quenby_file>();
    made->bytes = photo::save(*viewOf(pixels), as, {}, save, &made->lost);
    *file = made.release();
  });
}

int32_t quenby_filter_file(const uint8_t* file, size_t size, const char* filter, const char* params,
                           const quenby_face* faces, size_t face_count,
                           const quenby_open_options* open, const char* format,
                           const quenby_save_options* save, const quenby_cancel* cancel,
                           quenby_file** result, quenby_error* error) {
  if (result != nullptr) *result = nullptr;
  return guarded(error, [&] {
    required(result, "result");
    const photo::FilterRequest request{.filter = &required(filter, "filter"),
                                       .params = params == nullptr ? "" : params,
                                       .faces = facesOf(faces, face_count),
                                       .open = openOptions(open, cancel),
                                       .save = saveOptions(save, cancel),
                                       .mark = wantsMark(save)};
    auto made = std::make_unique<quenby_file>();
    std::optional<CallersWorkers> workers;
    const quenby_open_options options = optionsOf(open, "options");
    if (options.workers != nullptr) workers.emplace(*options.workers);
    photo::FilteredPhoto filtered = photo::filterPhoto(
        bytesOf(file, size), request, format == nullptr ? nullptr : &formatCalled(format),
        {.workers = workers ? &*workers : nullptr});
    made->bytes = std::move(filtered.file);
    made->lost = std::move(filtered.lost);
    *result = made.release();
  });
}

const uint8_t* quenby_file_data(const quenby_file* file) {
  return file == nullptr ? nullptr : file->bytes.data();
}

size_t quenby_file_size(const quenby_file* file) {
  return file == nullptr ? 0 : file->bytes.size();
}

size_t quenby_file_loss_count(const quenby_file* file) {
  return file == nullptr ? 0 : file->lost.size();
}

int32_t quenby_file_loss(const quenby_file* file, size_t index, quenby_loss* loss,
                         quenby_error* error) {
  return guarded(error, [&] {
    const auto& lost = required(file, "file").lost;
    if (index >= lost.size()) refuse("index", "there are " + std::to_string(lost.size()));
    give(loss, {0, lost[index].what.c_str(), lost[index].why.c_str()}, "loss");
  });
}

void quenby_file_free(quenby_file* file) {
  delete file;
}
