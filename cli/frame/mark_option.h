#pragma once

#include <string>

#include "cli/frame/verb.h"
#include "photo/filter_photo.h"

namespace pelorin::cli {

/// The options about the mark that an edited file carries.
struct MarkChoice {
  bool without = false;  ///< Leave it out.
  bool again = false;    ///< Edit files that carry one.
};

/// Adds `--no-mark` and `--again`.
void addMarkOptions(Verb verb, MarkChoice& choice);

/// The mark of an edit by the command: of `photo::markOf`, with a time only where the environment's
/// SOURCE_DATE_EPOCH states one, since the same photo is to give the same file.
photo::EditMark commandMark(const std::string& filter, const std::string& params);

}  // namespace pelorin::cli
