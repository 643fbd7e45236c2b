#pragma once

#include <jni.h>

namespace pelorin::quenby {

/// What Java may know a native object by: positive, counted up, and so never the same twice in a
/// process. Any thread may call.
jlong nextHandle();

}  // namespace pelorin::quenby
