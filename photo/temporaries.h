#pragma once

#include <string>

namespace pelorin::photo {

/// A temporary file that is to go should the process be asked to end at once; on record as long as
/// this lives.
class RecordedTemporary {
 public:
  /// Records nothing yet.
  RecordedTemporary() = default;
  ~RecordedTemporary() { forget(); }
  RecordedTemporary(const RecordedTemporary&) = delete;
  RecordedTemporary& operator=(const RecordedTemporary&) = delete;

  /// Those for which there is no room are not recorded; a later run sweeps them. Never throws.
  void record(const std::string& path) noexcept;
  void forget() noexcept;

 private:
  int slot_ = -1;
};

/// Removes the recorded temporaries, from a signal handler too: for a process that ends right after.
void removeTemporaries() noexcept;

}  // namespace pelorin::photo
