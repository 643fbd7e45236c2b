#pragma once

#include <condition_variable>
#include <cstdint>
#include <mutex>
#include <stop_token>

namespace pelorin::photo {

/// Memory that several photos at once share for their decoded pixels. Any thread may use it; it
/// outlives its shares.
class PixelBudget {
 public:
  explicit PixelBudget(std::uint64_t bytes) : bytes_(bytes) {}
  PixelBudget(const PixelBudget&) = delete;
  PixelBudget& operator=(const PixelBudget&) = delete;

  /// Part of a budget, given back in the end.
  class Share {
   public:
    /// Waits until so much is free, or, where that is more than there is at all, until all is.
    /// @param budget  null for one without an end.
    /// @throws Stopped while waiting.
    Share(PixelBudget* budget, std::uint64_t bytes, std::stop_token stop);
    ~Share();
    Share(const Share&) = delete;
    Share& operator=(const Share&) = delete;

   private:
    PixelBudget* const budget_;
    const std::uint64_t taken_;
  };

 private:
  const std::uint64_t bytes_;
  std::mutex mutex_;
  std::condition_variable_any freed_;
  std::uint64_t used_ = 0;
};

}  // namespace pelorin::photo
