#pragma once

namespace pelorin::image_processing {

// The numbers of CIE Lab, for the tables, for single colours and for vectors alike.

/// One row of a colour matrix: what each of three components counts, added in this order in float.
struct MatrixRow {
  float first, second, third;

  constexpr float operator()(float x, float y, float z) const {
    return first * x + second * y + third * z;
  }
};

/// Linear sRGB to X, Y and Z, each over that of white (IEC 61966-2-1, D65 divided out).
inline constexpr MatrixRow xOfRgb{0.43394995f, 0.3762098f, 0.1898403f};
inline constexpr MatrixRow yOfRgb{0.2126729f, 0.7151522f, 0.072175f};
inline constexpr MatrixRow zOfRgb{0.017756583f, 0.10946796f, 0.87277544f};

/// And back.
inline constexpr MatrixRow redOfXyz{3.0799544f, -1.5371385f, -0.5428159f};
inline constexpr MatrixRow greenOfXyz{-0.9212582f, 1.8760108f, 0.04524742f};
inline constexpr MatrixRow blueOfXyz{0.05288738f, -0.2040259f, 1.1511385f};

/// L = 116 fy - 16, a = 500 (fx - fy), b = 200 (fy - fz).
inline constexpr float labLGain = 116.0f, labLOffset = 16.0f, labAGain = 500.0f, labBGain = 200.0f;

/// L of white.
inline constexpr float labWhite = 100.0f;

/// Where companding goes from a line to a cube root, epsilon, and the slope of the line, kappa: the
/// rounded ones of the 1976 recommendation (CIE 15). Their product is the L of that place.
inline constexpr float cieEpsilon = 0.008856f, cieKappa = 903.3f, cieKappaEpsilon = 7.999625f;

/// Samples of the companding table and of the two inverse ones.
inline constexpr int compandingSamples = 10000, inverseCompandingSamples = 1000;

}  // namespace pelorin::image_processing
