#pragma once

namespace pelorin::image_processing {

/// Scales the colour of one pixel about its grey, which is 0.7 of green, 0.2 of red and 0.1 of blue
/// on purpose. A gain above 1 goes no further than the first channel that reaches 0 or 255, and
/// leaves alone what is redder than green or blue (skin); the boost fades in over five code values.
/// A gain below 1 desaturates every coloured pixel alike; below 0 results may wrap modulo 256. Grey
/// pixels stay. Never throws and keeps no state.
void vibranceInRGB(float amount, unsigned char& r, unsigned char& g, unsigned char& b);

}  // namespace pelorin::image_processing
