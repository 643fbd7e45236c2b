#include "image_processing/autoenhance/colour/colour_tables.h"

namespace pelorin::image_processing {

const ColourTables& colourTables() {
  // Never destroyed: threads may still filter while the process ends.
  static const ColourTables& tables = *new ColourTables;
  return tables;
}

namespace {
// At load, so that the first photo does not wait for them.
[[maybe_unused]] const ColourTables& builtAtLoad = colourTables();
}  // namespace

}  // namespace pelorin::image_processing
