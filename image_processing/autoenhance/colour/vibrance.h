#pragma once

namespace pelorin::image_processing {

/// What the channels count in the grey of a pixel: not the usual weights of luma, on purpose. Added
/// in the order green, red, blue.
inline constexpr float vibranceGreen = 0.7f, vibranceRed = 0.2f, vibranceBlue = 0.1f;

/// Code values over which a boost fades in as green or blue overtakes red.
inline constexpr float vibranceFade = 5.0f;

/// Scales the colour of one pixel about its grey. A gain above 1 goes no further than the first
/// channel that reaches 0 or 255, and leaves alone what is redder than green or blue (skin). A gain
/// below 1 desaturates every coloured pixel alike; below 0 results may wrap modulo 256. Grey pixels
/// stay. Never throws and keeps no state.
void vibranceInRGB(float amount, unsigned char& r, unsigned char& g, unsigned char& b);

}  // namespace pelorin::image_processing
