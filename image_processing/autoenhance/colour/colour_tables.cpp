#include "image_processing/autoenhance/colour/colour_tables.h"

#include "image_processing/core/never_destroyed.h"

namespace pelorin::image_processing {

const ColourTables& colourTables() {
  static const NeverDestroyed<ColourTables> tables;
  return *tables;
}

namespace {
// At load, so that the first photo does not wait for them.
[[maybe_unused]] const ColourTables& builtAtLoad = colourTables();
}  // namespace

}  // namespace pelorin::image_processing
