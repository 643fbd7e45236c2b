#pragma once

/// Marks what a shared library built from the engine shows to whoever loads it; everything else is
/// hidden.
#define PELORIN_EXPORT __attribute__((visibility("default")))
