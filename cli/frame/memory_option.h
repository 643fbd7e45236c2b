#pragma once

#include <cstddef>
#include <mutex>
#include <vector>

#include "cli/frame/verb.h"
#include "photo/photo_rows.h"

namespace pelorin::cli {

/// MiB of `--memory` where it is not given.
inline constexpr int usualMemory = 128;

/// Adds `--memory MIB` to a verb.
void addMemoryOption(Verb verb, int& mebibytes);

/// The memory that files at once share for their decoded pixels.
class KeptPixels {
 public:
  /// @param mebibytes  as `--memory` says.
  /// @param jobs       as `-j` says.
  KeptPixels(int mebibytes, int jobs, std::size_t files);

  /// What one of the files has of it, on the thread that makes it, as long as this lives.
  class Lent {
   public:
    explicit Lent(KeptPixels& pixels);
    ~Lent();
    Lent(const Lent&) = delete;
    Lent& operator=(const Lent&) = delete;

    photo::RowResources resources() const;

   private:
    KeptPixels& pixels_;
    photo::SparePixels* spare_ = nullptr;
  };

 private:
  const std::uint64_t each_;
  photo::PixelBudget budget_;
  // What threads keep of their own would take memory in a place that has no way to say that there is none.
  std::mutex mutex_;
  std::vector<photo::SparePixels> spares_;
  std::vector<photo::SparePixels*> free_;  // the last one is the last that was used
};

}  // namespace pelorin::cli
