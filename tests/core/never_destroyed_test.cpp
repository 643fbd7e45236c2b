#include "image_processing/core/never_destroyed.h"

#include <gtest/gtest.h>

namespace pelorin::image_processing {
namespace {

struct Counted {
  explicit Counted(int& destroyed) : destroyed(destroyed) {}
  ~Counted() { ++destroyed; }

  int& destroyed;
};

TEST(NeverDestroyed, IsDestroyedOnlyWhenItsLibraryIsUnloaded) {
  int destroyed = 0;
  const Counted* kept = nullptr;
  {
    const NeverDestroyed<Counted> object(destroyed);
    kept = &*object;
  }
  EXPECT_EQ(destroyed, 0);
  delete kept;
  libraryIsUnloaded = true;
  { const NeverDestroyed<Counted> object(destroyed); }
  libraryIsUnloaded = false;
  EXPECT_EQ(destroyed, 2);
}

}  // namespace
}  // namespace pelorin::image_processing
