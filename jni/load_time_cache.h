#pragma once

#include <jni.h>

namespace pelorin::quenby {

/// What the natives know of Java: written while the library is loaded, before any native can be
/// called, and only read afterwards.
struct LoadTimeCache {
  jclass rectF = nullptr;  ///< android.graphics.RectF; a global reference keeps its fields valid.
  jfieldID left = nullptr, top = nullptr, right = nullptr, bottom = nullptr;
  float similarityError = -2222.0f;  ///< ImageDupeDetector.SIMILARITY_ERROR.
};

inline LoadTimeCache loadTimeCache;

}  // namespace pelorin::quenby
