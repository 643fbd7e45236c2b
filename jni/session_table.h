#pragma once

#include <jni.h>

#include <array>
#include <cstddef>
#include <map>
#include <memory>
#include <mutex>

#include "jni/quenby_session.h"

namespace pelorin::quenby {

/// The sessions that are open in this process. A handle is the address of its session, never 0.
/// A native works on a share of its session, so a release meanwhile cannot take memory from under
/// it, and a handle that is not in the table reaches nothing. Any thread may call.
class SessionTable {
 public:
  /// @throws std::bad_alloc; the session is then gone.
  jlong open(std::shared_ptr<QuenbySession> session);

  /// Empty, with a line in the log, when no open session has that handle.
  std::shared_ptr<QuenbySession> find(jlong handle) const;

  /// Takes the session out of the table; a line in the log when it is not there.
  void release(jlong handle);

  std::size_t size() const;

 private:
  mutable std::mutex mutex_;
  std::map<jlong, std::shared_ptr<QuenbySession>> sessions_;
  // A weak pointer keeps the memory, though not the session. While it is here, no new session gets
  // that address, and the old handle stays unknown.
  std::array<std::weak_ptr<QuenbySession>, 256> recentlyReleased_;
  std::size_t releases_ = 0;
};

/// The table of the natives.
SessionTable& openSessions();

}  // namespace pelorin::quenby
