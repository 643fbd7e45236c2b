#include <limits>
#include <string>
#include <vector>

#include "bindings/c/boundary.h"
#include "image_processing/core/never_destroyed.h"
#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/parameter_check.h"

using namespace pelorin::c_api;
using namespace pelorin::image_processing;

namespace {

/// A filter of the registry, with texts that stay where they are.
struct Entry {
  const FilterDescription* filter;
  FilterParameters parameters;
  std::string required;
  std::vector<std::string> wanted;  // of each parameter
};

/// Made of the registry at the first call, then only read.
const std::vector<Entry>& entries() {
  static const NeverDestroyed<std::vector<Entry>> all([] {
    std::vector<Entry> made;
    for (const auto& [name, filter] : DefaultFilterFactory::filterFactory()->descriptions) {
      Entry entry{filter, filter->parameters(), {}, {}};
      entry.required = requiredParameters(entry.parameters);
      for (const FilterParameter& row : entry.parameters.rows) {
        entry.wanted.push_back(wantedValue(row, entry.parameters.reader));
      }
      made.push_back(std::move(entry));
    }
    return made;
  }());
  return *all;
}

const Entry& entryNamed(const char* name) {
  const std::string wanted = &required(name, "filter");
  for (const Entry& entry : entries()) {
    if (entry.filter->name == wanted) return entry;
  }
  refuse("filter", "there is no '" + wanted + "'");
}

template <typename List>
decltype(auto) at(const List& list, std::size_t index) {
  if (index >= list.size()) refuse("index", "there are " + std::to_string(list.size()));
  return list[index];
}

void describe(const Entry& entry, quenby_filter* filter) {
  give(filter,
       {.struct_size = 0,
        .name = entry.filter->name.c_str(),
        .display_name = entry.filter->displayName.c_str(),
        .description = entry.filter->description.c_str(),
        .required = entry.required.c_str(),
        .parameter_count = static_cast<uint32_t>(entry.parameters.rows.size()),
        .reads_faces = entry.parameters.readsFaces},
       "filter");
}

}  // namespace

int32_t quenby_filter_count(size_t* count, quenby_error* error) {
  return guarded(error, [&] { required(count, "count") = entries().size(); });
}

int32_t quenby_filter_at(size_t index, quenby_filter* filter, quenby_error* error) {
  return guarded(error, [&] { describe(at(entries(), index), filter); });
}

int32_t quenby_filter_named(const char* name, quenby_filter* filter, quenby_error* error) {
  return guarded(error, [&] { describe(entryNamed(name), filter); });
}

int32_t quenby_parameter_at(const char* filter, size_t index, quenby_parameter* parameter,
                            quenby_error* error) {
  return guarded(error, [&] {
    const Entry& entry = entryNamed(filter);
    const FilterParameter& row = at(entry.parameters.rows, index);
    give(parameter,
         {.struct_size = 0,
          .name = row.name.c_str(),
          .description = row.description.c_str(),
          .wanted = entry.wanted[index].c_str(),
          .only_with = row.onlyWith.c_str(),
          .kind = static_cast<int32_t>(row.kind),
          .required = row.required,
          .lowest = row.lowest,
          .highest = row.highest,
          .above_lowest = row.aboveLowest,
          .fewest = static_cast<uint32_t>(row.fewest),
          .standard = row.standard.value_or(std::numeric_limits<float>::quiet_NaN())},
         "parameter");
  });
}

int32_t quenby_check_parameters(const char* filter, const char* params, quenby_fault* faults,
                                size_t capacity, size_t* count, quenby_error* error) {
  if (count != nullptr) *count = 0;
  return guarded(error, [&] {
    required(count, "count");
    array(faults, capacity, "faults");
    const auto found = checkParameters(*entryNamed(filter).filter, params == nullptr ? "" : params);
    for (size_t i = 0; i < found.size() && i < capacity; ++i) {
      faults[i].kind = static_cast<int32_t>(found[i].kind);
      copyText(faults[i].key, found[i].key);
      copyText(faults[i].message, found[i].message);
    }
    *count = found.size();
  });
}

static_assert(QUENBY_NUMBERS == static_cast<int>(ParameterKind::numbers));
static_assert(QUENBY_BOOLEAN == static_cast<int>(ParameterKind::boolean));
static_assert(QUENBY_IGNORED == static_cast<int>(ParameterFault::Kind::ignored));
static_assert(QUENBY_UNREADABLE == static_cast<int>(ParameterFault::Kind::unreadable));
