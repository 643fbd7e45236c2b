#pragma once

#include <jni.h>

#include <cstddef>
#include <map>
#include <memory>
#include <mutex>

#include "jni/quenby_session.h"

namespace pelorin::quenby {

/// The sessions that are open in this process. Handles are positive and count up, whichever table
/// gives them, so none is ever used twice and an old one reaches nothing. A native works on a share
/// of its session, so a release meanwhile cannot take memory from under it. Any thread may call.
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
};

/// The table of the natives.
SessionTable& openSessions();

}  // namespace pelorin::quenby
