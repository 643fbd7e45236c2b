#include "image_processing/dupe/cdf_distance.h"

using namespace pelorin::image_processing;

int main() {
  return exposureInvariantCDFDistance(GreenCDF(), GreenCDF()) >= 0 ? 0 : 1;
}
