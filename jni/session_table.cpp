#include "jni/session_table.h"

#include <utility>

#include "image_processing/core/never_destroyed.h"
#include "jni/handles.h"
#include "jni/log.h"

namespace pelorin::quenby {
namespace {

void logUnknown(jlong handle) {
  pn_printLog(logError, logTag, "no session has the handle %lld", static_cast<long long>(handle));
}

}  // namespace

jlong SessionTable::open(std::shared_ptr<QuenbySession> session) {
  const jlong handle = nextHandle();
  const std::lock_guard lock(mutex_);
  sessions_.emplace(handle, std::move(session));
  return handle;
}

std::shared_ptr<QuenbySession> SessionTable::find(jlong handle) const {
  {
    const std::lock_guard lock(mutex_);
    const auto found = sessions_.find(handle);
    if (found != sessions_.end()) return found->second;
  }
  logUnknown(handle);
  return nullptr;
}

void SessionTable::release(jlong handle) {
  std::shared_ptr<QuenbySession> session;  // freed after the lock
  {
    const std::lock_guard lock(mutex_);
    const auto found = sessions_.find(handle);
    if (found != sessions_.end()) {
      session = std::move(found->second);
      sessions_.erase(found);
      return;
    }
  }
  logUnknown(handle);
}

std::size_t SessionTable::size() const {
  const std::lock_guard lock(mutex_);
  return sessions_.size();
}

SessionTable& openSessions() {
  static const image_processing::NeverDestroyed<SessionTable> table;
  return *table;
}

}  // namespace pelorin::quenby
