#pragma once

#include <string>

namespace pelorin::bench {

/// Times every kernel on 12 megapixels, as defined and on each instruction set of the columns,
/// beside a copy of the picture. @returns a Markdown table.
std::string stagesTable();

}  // namespace pelorin::bench
