#pragma once

#include "image_processing/core/export.h"
#include "image_processing/features/xy.h"

/// FAST corners: a pixel is a corner when N neighbouring pixels of the 16 on the circle of radius 3
/// around it are all brighter than the pixel by more than a threshold, or all darker (Rosten and
/// Drummond, "Machine Learning for High-Speed Corner Detection", 2006). N is 9, 10, 11 or 12.
///
/// Pixels: 8-bit grey, the pixel of column x and row y at `pixels[y * stride + x]`, addressed in 64
/// bits; the stride may be negative. No pixels, or a side of 6 or less, negative ones included, is
/// a picture without corners.
///
/// Threshold `b`: any number. From 255 on there are no corners; at -256 and below every pixel away
/// from the border is one.
///
/// Memory: returned arrays come from `malloc` and are the caller's to `free`. When memory runs out,
/// or there are more corners than an int counts, the result is null with a count of 0 and nothing
/// is left behind. Nothing throws, nothing keeps state: any thread may call anything.
extern "C" {

/// Corners at least three pixels from every border, in raster order.
/// @param count  written: how many there are.
/// @returns an array even when there are none.
PELORIN_EXPORT xy* fast9_detect(const unsigned char* pixels, int xsize, int ysize, int stride,
                                int b, int* count);
PELORIN_EXPORT xy* fast10_detect(const unsigned char* pixels, int xsize, int ysize, int stride,
                                 int b, int* count);
PELORIN_EXPORT xy* fast11_detect(const unsigned char* pixels, int xsize, int ysize, int stride,
                                 int b, int* count);
PELORIN_EXPORT xy* fast12_detect(const unsigned char* pixels, int xsize, int ysize, int stride,
                                 int b, int* count);

/// Score of one pixel: the largest threshold up to 254 at which it is a corner, or `b` where that
/// is larger or the pixel is none at `b`.
/// @param centre   the pixel.
/// @param offsets  16 steps in bytes from it to the circle, once round.
PELORIN_EXPORT int fast9_corner_score(const unsigned char* centre, const int* offsets, int b);
PELORIN_EXPORT int fast10_corner_score(const unsigned char* centre, const int* offsets, int b);
PELORIN_EXPORT int fast11_corner_score(const unsigned char* centre, const int* offsets, int b);
PELORIN_EXPORT int fast12_corner_score(const unsigned char* centre, const int* offsets, int b);

/// Scores of `count` corners, which must lie three pixels or more inside the picture.
/// @returns an array even when `count` is 0 or less; null when there are corners but no pixels.
PELORIN_EXPORT int* fast9_score(const unsigned char* pixels, int stride, const xy* corners,
                                int count, int b);
PELORIN_EXPORT int* fast10_score(const unsigned char* pixels, int stride, const xy* corners,
                                 int count, int b);
PELORIN_EXPORT int* fast11_score(const unsigned char* pixels, int stride, const xy* corners,
                                 int count, int b);
PELORIN_EXPORT int* fast12_score(const unsigned char* pixels, int stride, const xy* corners,
                                 int count, int b);

/// The corners of `fastN_detect` that `nonmax_suppression` keeps by their scores.
/// @param count  written: how many there are.
/// @returns null when there are no corners to begin with.
PELORIN_EXPORT xy* fast9_detect_nonmax(const unsigned char* pixels, int xsize, int ysize,
                                       int stride, int b, int* count);
PELORIN_EXPORT xy* fast10_detect_nonmax(const unsigned char* pixels, int xsize, int ysize,
                                        int stride, int b, int* count);
PELORIN_EXPORT xy* fast11_detect_nonmax(const unsigned char* pixels, int xsize, int ysize,
                                        int stride, int b, int* count);
PELORIN_EXPORT xy* fast12_detect_nonmax(const unsigned char* pixels, int xsize, int ysize,
                                        int stride, int b, int* count);

/// Keeps the corners that score higher than every corner among their eight neighbours, in order.
/// Neighbours with the same score drop each other.
/// @param corners  `count` positions in raster order; any numbers, negative ones too.
/// @param scores   of the corners.
/// @param kept     written: how many are kept.
/// @returns null when `count` is 0 or less, there are no arrays, or the order is another one.
PELORIN_EXPORT xy* nonmax_suppression(const xy* corners, const int* scores, int count, int* kept);
}
