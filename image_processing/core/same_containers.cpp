#include "image_processing/core/same_containers.h"

namespace pelorin::image_processing {

const char PELORIN_CONTAINERS = 0;

}  // namespace pelorin::image_processing
