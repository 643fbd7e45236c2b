#pragma once

#include <jni.h>

#include <map>
#include <mutex>
#include <stop_token>

namespace pelorin::quenby {

/// What Java gives up work with: a handle, known to a call that is at work and to another thread that
/// wants it to end. Handles are those of `nextHandle`. Any thread may call.
class Cancellations {
 public:
  /// @throws std::bad_alloc.
  jlong open();

  /// Asks every call with this handle to end, also those that only begin. Nothing happens for a
  /// handle that is none.
  void cancel(jlong handle);

  /// Forgets the handle; calls at work are not asked to end, but keep what they have.
  void close(jlong handle);

  /// What a call looks at; for 0 one that never asks to end.
  /// @throws std::invalid_argument for a handle that is none.
  std::stop_token token(jlong handle) const;

 private:
  mutable std::mutex mutex_;
  std::map<jlong, std::stop_source> sources_;
};

/// Those of the natives.
Cancellations& cancellations();

}  // namespace pelorin::quenby
