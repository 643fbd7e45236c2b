#pragma once

// With GCC's debug containers, vectors and maps have other sizes. A program that has them and a Quenby
// that does not, or the other way round, would crash; instead they do not link, for want of a name that
// says why.

#ifdef _GLIBCXX_DEBUG
#define PELORIN_CONTAINERS QuenbyWasCompiledWith_GLIBCXX_DEBUG
#else
#define PELORIN_CONTAINERS QuenbyWasCompiledWithout_GLIBCXX_DEBUG
#endif

namespace pelorin::image_processing {

extern const char PELORIN_CONTAINERS;  // defined as the library was compiled
[[gnu::used]] static const char* const theSameContainers = &PELORIN_CONTAINERS;

}  // namespace pelorin::image_processing
