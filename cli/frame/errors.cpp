#include "cli/frame/errors.h"

#include <boost/lexical_cast/bad_lexical_cast.hpp>
#include <cerrno>
#include <new>
#include <system_error>

namespace pelorin::cli {
namespace {

std::string advice(int code) {
  switch (code) {
    case ENOSPC:
    case EDQUOT:
      return "; free some space or choose another output";
    case EFBIG:
      return "; raise the file size limit (ulimit -f) or choose another output";
    case EACCES:
    case EPERM:
    case EROFS:
      return "; choose a place that you may read and write";
    case ENOENT:
    case ENOTDIR:
      return "; check the path";
    case EEXIST:
      return "; add --overwrite to replace it";
    case EISDIR:
      return "; name a file, or add -r to take the photos of a folder";
    default:
      return "";
  }
}

}  // namespace

std::string explain(const std::exception& error) {
  if (const auto* system = dynamic_cast<const std::system_error*>(&error)) {
    return system->code().message() + advice(system->code().value());
  }
  if (dynamic_cast<const std::bad_alloc*>(&error) != nullptr) {
    return "not enough memory; try --scale 2 or fewer files at once (-j 1)";
  }
  if (dynamic_cast<const boost::bad_lexical_cast*>(&error) != nullptr) {
    return "a parameter is no number; see --params";
  }
  if (dynamic_cast<const std::out_of_range*>(&error) != nullptr) {
    return "the filter misses a parameter; see --params";
  }
  return error.what();
}

}  // namespace pelorin::cli
