#pragma once

#include "platform/pn/log.h"

namespace pelorin::quenby {

constexpr const char* logTag = "QuenbyLib";
constexpr int logDebug = 3;  ///< Progress.
constexpr int logError = 6;  ///< Failures.

}  // namespace pelorin::quenby
