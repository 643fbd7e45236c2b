#pragma once

#include <memory>
#include <string>

#include "image_processing/filters/abstract_filter.h"

namespace pelorin::image_processing {

/// One row of the registry: what a filter is called and how it is made. Immutable after
/// construction, so any thread may read it.
class FilterDescription {
 public:
  FilterDescription(const char* name, const char* displayName, const char* description)
      : name(name), displayName(displayName), description(description) {}
  FilterDescription(const FilterDescription&) = delete;
  FilterDescription& operator=(const FilterDescription&) = delete;

  /// A new filter bound to `state`; not initialised yet.
  virtual std::unique_ptr<AbstractFilter> makeFilter(
      std::shared_ptr<FilteredImageState>& state) const = 0;
  virtual ~FilterDescription() = default;
  /// What its filters take beside the photo.
  virtual FilterParameters parameters() const { return {}; }

  const std::string name;         ///< Registry key.
  const std::string displayName;  ///< What users see; several filters may share one.
  const std::string description;  ///< One or more sentences for users.
};

/// The description of a filter class `F`, constructible from the session's state.
template <typename F>
class ConcreteDescription : public FilterDescription {
 public:
  using FilterDescription::FilterDescription;

  std::unique_ptr<AbstractFilter> makeFilter(
      std::shared_ptr<FilteredImageState>& state) const override {
    return std::make_unique<F>(state);
  }
  FilterParameters parameters() const override { return F::parameters(); }
};

}  // namespace pelorin::image_processing
