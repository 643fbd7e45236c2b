#include "photo/jpeg/cmyk_to_rgba.h"

#include <lcms2.h>

#include <cstddef>
#include <memory>
#include <type_traits>

namespace pelorin::photo {
namespace {

struct CloseProfile {
  void operator()(void* profile) const { cmsCloseProfile(profile); }
};
using Profile = std::unique_ptr<std::remove_pointer_t<cmsHPROFILE>, CloseProfile>;

// Null when the profile is of no use.
cmsHTRANSFORM transformFrom(std::span<const std::uint8_t> bytes, bool inverted) {
  if (bytes.empty()) return nullptr;
  const Profile inks(
      cmsOpenProfileFromMem(bytes.data(), static_cast<cmsUInt32Number>(bytes.size())));
  if (inks == nullptr || cmsGetColorSpace(inks.get()) != cmsSigCmykData) return nullptr;
  const Profile screen(cmsCreate_sRGBProfile());
  if (screen == nullptr) return nullptr;
  return cmsCreateTransform(inks.get(), inverted ? TYPE_CMYK_8_REV : TYPE_CMYK_8, screen.get(),
                            TYPE_RGBA_8, INTENT_PERCEPTUAL, 0);
}

// Light through one ink and black, each a byte with 255 for no ink.
std::uint8_t lightThrough(unsigned ink, unsigned black) {
  return static_cast<std::uint8_t>((ink * black + 127) / 255);
}

void convertSimply(std::uint8_t* pixels, std::size_t count, bool inverted) {
  const unsigned flip = inverted ? 0 : 255;
  for (std::uint8_t* p = pixels; p != pixels + count * 4; p += 4) {
    const unsigned black = p[3] ^ flip;
    for (int i = 0; i < 3; ++i) p[i] = lightThrough(p[i] ^ flip, black);
    p[3] = 255;
  }
}

}  // namespace

void CmykToRgba::DeleteTransform::operator()(void* transform) const {
  cmsDeleteTransform(transform);
}

CmykToRgba::CmykToRgba(bool inverted, std::span<const std::uint8_t> profile)
    : inverted_(inverted), transform_(transformFrom(profile, inverted)) {}

void CmykToRgba::convertRow(std::uint8_t* row, std::uint32_t width) const {
  if (transform_ == nullptr) return convertSimply(row, width, inverted_);
  cmsDoTransform(transform_.get(), row, row, width);
  for (std::uint32_t x = 0; x < width; ++x) row[std::size_t{x} * 4 + 3] = 255;
}

}  // namespace pelorin::photo
