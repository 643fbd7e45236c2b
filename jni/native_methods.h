#pragma once

#include <jni.h>

#include <span>

namespace pelorin::quenby {

/// A row of a table of natives.
JNINativeMethod nativeMethod(const char* name, const char* signature, void* function);

/// Registers natives with their class.
/// @throws JniError, as a rule with a Java exception pending, when the class or a method is missing.
void registerNatives(const char* className, std::span<const JNINativeMethod> methods);

}  // namespace pelorin::quenby
