#pragma once

#include "photo/picture_size.h"
#include "photo/turn.h"

namespace pelorin::photo {

/// How a picture differs from the one that its file's metadata was written for.
struct PictureChange {
  PictureSize before;   ///< As the file stores it.
  PictureSize after;    ///< Turned and scaled.
  Turn turn;            ///< From the one to the other.
  int orientation = 1;  ///< What the file's EXIF states of it, 1 ... 8.
};

/// Whether every pixel is where it was, so that places in pixels stay true.
inline bool isUnmoved(const PictureChange& change) {
  return change.turn == Turn{} && change.before == change.after;
}

/// A point in fractions of a picture's width and height, 0,0 its top left corner.
struct PicturePoint {
  double x, y;
};

/// Where a point of the picture comes to stand.
inline PicturePoint turned(PicturePoint point, Turn turn) {
  if (turn.mirrored) point.x = 1 - point.x;
  for (int i = 0; i < turn.quarters; ++i) point = {1 - point.y, point.x};
  return point;
}

}  // namespace pelorin::photo
