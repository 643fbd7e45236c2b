#pragma once

#include <utility>

namespace pelorin::image_processing {

/// To be set before a library that holds this code is unloaded from a process that goes on.
inline bool libraryIsUnloaded = false;

/// A static object that is not destroyed at the end of the process, while threads may still read it,
/// but only when the library goes that it belongs to.
template <typename T>
class NeverDestroyed {
 public:
  template <typename... Arguments>
  explicit NeverDestroyed(Arguments&&... arguments)
      : object_(new T(std::forward<Arguments>(arguments)...)) {}
  ~NeverDestroyed() {
    if (libraryIsUnloaded) delete object_;
  }
  NeverDestroyed(const NeverDestroyed&) = delete;
  NeverDestroyed& operator=(const NeverDestroyed&) = delete;

  T& operator*() const { return *object_; }

 private:
  T* const object_;
};

}  // namespace pelorin::image_processing
