#include "photo/jpeg/libjpeg_errors.h"

#include <jerror.h>

#include <new>
#include <string>
#include <string_view>

#include "photo/jpeg/jpeg_codec.h"

namespace pelorin::photo {
namespace {

// Warnings after which every sample is still the one the file holds.
bool isHarmless(int warning) {
  switch (warning) {
    case JWRN_EXTRANEOUS_DATA:
    case JWRN_ADOBE_XFORM:
    case JWRN_JFIF_MAJOR:
    case JWRN_NOT_SEQUENTIAL:
    case JWRN_BOGUS_ICC:
      return true;
    default:
      return false;
  }
}

PhotoError errorOf(int code, std::string_view message) {
  using Kind = PhotoError::Kind;
  switch (code) {
    case JERR_INPUT_EMPTY:
    case JERR_NO_SOI:
      return {Kind::notAPhoto, "not a JPEG file"};
    case JERR_NO_IMAGE:
      return {Kind::damaged, "a JPEG file without a picture"};
    case JWRN_JPEG_EOF:
      return {Kind::truncated, "truncated: the picture data ends early"};
    case JERR_IMAGE_TOO_BIG:
      return {Kind::unsupported, "a side is over 65500 pixels"};
    case JERR_BAD_PRECISION:
      return {Kind::unsupported, "unsupported: only 8 bits a sample can be read"};
    case JERR_SOF_UNSUPPORTED:
      return {Kind::unsupported, "unsupported: neither a baseline nor a progressive JPEG file"};
    case JERR_BAD_MCU_SIZE:
    case JERR_MISMATCHED_QUANT_TABLE:
      return {Kind::unsupported, "unsupported: " + std::string(message)};
    default:
      break;
  }
  constexpr std::string_view prefix = "Corrupt JPEG data: ";
  if (message.starts_with(prefix)) message.remove_prefix(prefix.size());
  return {Kind::damaged, "damaged: " + std::string(message)};
}

}  // namespace

LibjpegErrors::LibjpegErrors() : state_() {
  jpeg_std_error(&state_.base);
  state_.base.error_exit = jumpOut;
  state_.base.emit_message = jumpOutIfDamaged;
  state_.base.output_message = [](j_common_ptr) {};
}

void LibjpegErrors::jumpOut(j_common_ptr codec) {
  reinterpret_cast<State*>(codec->err)->wayOut.take();
}

void LibjpegErrors::jumpOutIfDamaged(j_common_ptr codec, int level) {
  const bool isWarning = level < 0;
  if (isWarning && !isHarmless(codec->err->msg_code)) jumpOut(codec);
}

void LibjpegErrors::throwError() {
  const int code = state_.base.msg_code;
  if (code == JERR_OUT_OF_MEMORY) throw std::bad_alloc();
  jpeg_common_struct codec = {};
  codec.err = &state_.base;
  char message[JMSG_LENGTH_MAX];
  state_.base.format_message(&codec, message);
  throw errorOf(code, message);
}

}  // namespace pelorin::photo
