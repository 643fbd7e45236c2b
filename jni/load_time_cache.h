#pragma once

#include <jni.h>

namespace pelorin::quenby {

/// What the natives know of Java: written while the library is loaded, before any native can be
/// called, and only read afterwards.
struct LoadTimeCache {
  /// android.graphics.RectF, held weakly: a class loader of its own may go, and the library with it.
  /// Whoever calls a native with rectangles keeps the class, and so the fields valid.
  jweak rectF = nullptr;
  jfieldID left = nullptr, top = nullptr, right = nullptr, bottom = nullptr;
  float similarityError = -2222.0f;  ///< ImageDupeDetector.SIMILARITY_ERROR.
};

inline LoadTimeCache loadTimeCache;

}  // namespace pelorin::quenby
