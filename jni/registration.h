#pragma once

#include <jni.h>

namespace pelorin::quenby {

/// Fills the load-time cache with what is known of RectF and registers the natives of QuenbyEngine.
/// @throws JniError, as a rule with a Java exception pending, when a class, field or method of
///         theirs is missing.
void registerQuenbyFilterNatives();

/// Registers the native of ImageDupeDetector and reads its SIMILARITY_ERROR; throws likewise.
void registerImageDupeDetectorNatives();

/// Gives up the references that registering made.
void forgetJava(JNIEnv* env);

}  // namespace pelorin::quenby
