#pragma once

/// A position in a picture: column, then row. Lies outside every namespace, as the functions of
/// fast.h do that hand it to C.
struct xy {
  int x;
  int y;

  friend bool operator==(const xy&, const xy&) = default;
};
