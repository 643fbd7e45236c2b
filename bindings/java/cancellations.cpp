#include "bindings/java/cancellations.h"

#include <optional>
#include <stdexcept>

#include "image_processing/core/never_destroyed.h"
#include "jni/handles.h"

namespace pelorin::quenby {

jlong Cancellations::open() {
  std::stop_source source;
  const jlong handle = nextHandle();
  const std::lock_guard lock(mutex_);
  sources_.emplace(handle, source);
  return handle;
}

void Cancellations::cancel(jlong handle) {
  std::optional<std::stop_source> source;
  {
    const std::lock_guard lock(mutex_);
    const auto found = sources_.find(handle);
    if (found != sources_.end()) source = found->second;
  }
  if (source) source->request_stop();
}

void Cancellations::close(jlong handle) {
  const std::lock_guard lock(mutex_);
  sources_.erase(handle);
}

std::stop_token Cancellations::token(jlong handle) const {
  if (handle == 0) return {};
  const std::lock_guard lock(mutex_);
  const auto found = sources_.find(handle);
  if (found == sources_.end()) throw std::invalid_argument("cancel: no such handle");
  return found->second.get_token();
}

Cancellations& cancellations() {
  static const image_processing::NeverDestroyed<Cancellations> all;
  return *all;
}

}  // namespace pelorin::quenby
