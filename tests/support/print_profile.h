#pragma once

#include "tests/support/jpeg_files.h"

namespace pelorin::test_support {

/// A print profile for inks that nobody sells, so that only the profile explains the colour: every ink
/// darkens, but what is called cyan takes blue away, magenta green and yellow red. Its table has the form
/// that profiles of `version` have, of which there is one before 4 and one from there on. All inks together leave
/// `black` of the light, from 0 to 1.
Bytes profileOfSwappedInks(double version = 4.2, double black = 0);

}  // namespace pelorin::test_support
