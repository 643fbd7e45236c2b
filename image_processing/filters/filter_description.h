#pragma once

#include <memory>
#include <string>
#include <utility>

#include "image_processing/filters/abstract_filter.h"
#include "image_processing/filters/row_filter.h"
#include "image_processing/filters/through_picture.h"

namespace pelorin::image_processing {

/// One row of the registry: what a filter is called and how it is made. Immutable after
/// construction, so any thread may read it.
class FilterDescription {
 public:
  FilterDescription(const char* key, const char* title, const char* sentences)
      : name(key), displayName(title), description(sentences) {}
  FilterDescription(const FilterDescription&) = delete;
  FilterDescription& operator=(const FilterDescription&) = delete;

  /// A new filter bound to `state`; not initialised yet.
  virtual std::unique_ptr<AbstractFilter> makeFilter(
      std::shared_ptr<FilteredImageState>& state) const = 0;
  /// A filter for one picture that comes as rows.
  /// @throws std::bad_alloc, and what the filter throws for such parameters, here or at its work.
  virtual std::unique_ptr<RowFilter> makeRowFilter(RowRequest request) const {
    return throughPicture(
        [this](std::shared_ptr<FilteredImageState>& state) { return makeFilter(state); },
        std::move(request));
  }
  virtual ~FilterDescription() = default;
  /// What its filters take beside the photo.
  virtual FilterParameters parameters() const { return {}; }

  const std::string name;         ///< Registry key.
  const std::string displayName;  ///< What users see; several filters may share one.
  const std::string description;  ///< One or more sentences for users.
};

/// The description of a filter class `F`, constructible from the session's state. A filter that can
/// do without the whole picture has a static function `forRows`, which takes a `RowRequest`.
template <typename F>
class ConcreteDescription : public FilterDescription {
 public:
  using FilterDescription::FilterDescription;

  std::unique_ptr<AbstractFilter> makeFilter(
      std::shared_ptr<FilteredImageState>& state) const override {
    return std::make_unique<F>(state);
  }
  std::unique_ptr<RowFilter> makeRowFilter(RowRequest request) const override {
    if constexpr (requires { F::forRows(request); }) {
      return F::forRows(request);
    } else {
      return FilterDescription::makeRowFilter(std::move(request));
    }
  }
  FilterParameters parameters() const override { return F::parameters(); }
};

}  // namespace pelorin::image_processing
