#include "image_processing/autoenhance/colour/vibrance.h"

#include <algorithm>
#include <cstdint>

#include "image_processing/core/float_to_integer.h"

namespace pelorin::image_processing {

void vibranceInRGB(float amount, unsigned char& r, unsigned char& g, unsigned char& b) {
  const float red = r, green = g, blue = b;
  const float highest = std::max({red, green, blue});
  const float lowest = std::min({red, green, blue});
  if (highest == lowest) return;

  const float grey = vibranceGreen * green + vibranceRed * red + vibranceBlue * blue;
  const float roomAbove = (255.0f - grey) / (highest - grey);
  const float roomBelow = -grey / (lowest - grey);
  float gain = std::min(roomAbove, roomBelow);
  if (!(gain < amount)) gain = amount;
  if (amount > 1.0f) {
    const float notRed = std::clamp((std::max(green, blue) - red) / vibranceFade, 0.0f, 1.0f);
    gain = 1.0f - notRed + notRed * gain;
  }
  const auto scaled = [grey, gain](float channel) {
    return static_cast<unsigned char>(truncateTo<std::uint32_t>(grey + gain * (channel - grey)));
  };
  r = scaled(red);
  g = scaled(green);
  b = scaled(blue);
}

}  // namespace pelorin::image_processing
