#include "cli/frame/coding_option.h"

#include "cli/frame/errors.h"
#include "cli/frame/number_text.h"
#include "photo/format.h"

namespace pelorin::cli {

void addCodingOptions(Verb verb, CodingChoice& choice) {
  verb.option("--quality", choice.quality,
              photo::lossyFormats() +
                  " quality, 1 to 100, or auto: the photo's own, as its tables tell; 90 unless "
                  "given, auto with --in-place")
      .type("Q")
      .group("Output");
  verb.option("--subsampling", choice.subsampling,
              "How much colour JPEG files hold; as the photo's own file unless given")
      .oneOf({"444", "422", "420"})
      .group("Output");
}

int qualityOf(const CodingChoice& choice, int otherwise) {
  if (choice.quality.empty()) return otherwise;
  if (choice.quality == "auto") return photo::sourceQuality;
  const std::uint32_t quality = readPositiveInteger("--quality", choice.quality);
  if (quality > 100) throw UsageError("--quality: must be from 1 to 100, or auto");
  return static_cast<int>(quality);
}

std::optional<photo::ChromaSampling> samplingOf(const CodingChoice& choice) {
  if (choice.subsampling.empty()) return std::nullopt;
  if (choice.subsampling == "444") return photo::ChromaSampling{1, 1};
  if (choice.subsampling == "422") return photo::ChromaSampling{2, 1};
  return photo::ChromaSampling{2, 2};
}

}  // namespace pelorin::cli
