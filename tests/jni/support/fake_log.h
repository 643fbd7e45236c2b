#pragma once

#include <string>
#include <vector>

namespace pelorin::test_support {

/// The lines that pn_printLog was given since the last call, each as "priority tag: text". Takes
/// the place of the library's function in the tests of the natives; any thread may print.
std::vector<std::string> takeLogLines();

}  // namespace pelorin::test_support
