#include "photo/temporaries.h"

#include <unistd.h>

#include <array>
#include <atomic>
#include <climits>
#include <cstring>

namespace pelorin::photo {
namespace {

enum class State { free, taken, recorded };

struct Slot {
  std::atomic<State> state = State::free;
  std::array<char, PATH_MAX> path;
};

// Pages of it that nobody uses cost nothing.
std::array<Slot, 256> slots;
static_assert(std::atomic<State>::is_always_lock_free);

}  // namespace

void RecordedTemporary::record(const std::string& path) noexcept {
  forget();
  if (path.size() >= slots[0].path.size()) return;
  for (std::size_t i = 0; i < slots.size(); ++i) {
    State expected = State::free;
    if (!slots[i].state.compare_exchange_strong(expected, State::taken)) continue;
    std::memcpy(slots[i].path.data(), path.c_str(), path.size() + 1);
    slots[i].state = State::recorded;
    slot_ = static_cast<int>(i);
    return;
  }
}

void RecordedTemporary::forget() noexcept {
  if (slot_ >= 0) slots[static_cast<std::size_t>(slot_)].state = State::free;
  slot_ = -1;
}

void removeTemporaries() noexcept {
  for (const Slot& slot : slots) {
    if (slot.state == State::recorded) ::unlink(slot.path.data());
  }
}

}  // namespace pelorin::photo
