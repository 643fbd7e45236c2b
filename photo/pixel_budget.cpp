#include "photo/pixel_budget.h"

#include <algorithm>
#include <utility>

#include "photo/photo_error.h"

namespace pelorin::photo {

PixelBudget::Share::Share(PixelBudget* budget, std::uint64_t bytes, std::stop_token stop)
    : budget_(budget), taken_(budget == nullptr ? 0 : std::min(bytes, budget->bytes_)) {
  if (budget_ == nullptr) return;
  std::unique_lock lock(budget_->mutex_);
  const bool free = budget_->freed_.wait(
      lock, std::move(stop), [this] { return budget_->used_ <= budget_->bytes_ - taken_; });
  if (!free) throw Stopped();
  budget_->used_ += taken_;
}

PixelBudget::Share::~Share() {
  if (budget_ == nullptr) return;
  {
    const std::lock_guard lock(budget_->mutex_);
    budget_->used_ -= taken_;
  }
  budget_->freed_.notify_all();
}

}  // namespace pelorin::photo
