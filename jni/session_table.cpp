#include "jni/session_table.h"

#include <cstdint>
#include <utility>

#include "jni/log.h"

namespace pelorin::quenby {
namespace {

void logUnknown(jlong handle) {
  pn_printLog(logError, logTag, "no session has the handle %lld", static_cast<long long>(handle));
}

}  // namespace

jlong SessionTable::open(std::shared_ptr<QuenbySession> session) {
  const auto handle = static_cast<jlong>(reinterpret_cast<std::uintptr_t>(session.get()));
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
      recentlyReleased_[releases_++ % recentlyReleased_.size()] = session;
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
  // Never destroyed: Java threads may still run while the process ends.
  static auto* const table = new SessionTable;
  return *table;
}

}  // namespace pelorin::quenby
