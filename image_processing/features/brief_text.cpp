#include <bitset>
#include <ostream>
#include <string>

#include "image_processing/features/brief.h"

namespace pelorin::image_processing {

std::ostream& operator<<(std::ostream& stream, const xy& position) {
  return stream << "(" << position.x << ", " << position.y << ")";
}

std::ostream& operator<<(std::ostream& stream, const BriefDescriptor& descriptor) {
  std::string bits;
  for (const std::uint32_t word : descriptor.descriptor) {
    bits.insert(0, std::bitset<32>(word).to_string());
  }
  return stream << "{ center = " << descriptor.center << ", descriptor = " << bits.substr(0, 5)
                << "..." << bits.substr(bits.size() - 5) << " }";
}

std::ostream& operator<<(std::ostream& stream, const std::vector<BriefDescriptor>& descriptors) {
  const char* separator = "";
  for (const BriefDescriptor& descriptor : descriptors) {
    stream << separator << descriptor;
    separator = ", ";
  }
  return stream;
}

}  // namespace pelorin::image_processing
