#pragma once

#include <string>

#include "cli/frame/command_text.h"

namespace pelorin::cli {

/// The page quenby(1), which lists the verbs, in the man macros.
std::string manPage(const CommandText& command);

/// The page of a verb, quenby-VERB(1).
std::string manPage(const CommandText& command, const VerbText& verb);

}  // namespace pelorin::cli
