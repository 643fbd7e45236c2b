#pragma once

namespace pelorin::cli {

/// Makes freed memory stay with the process: given back, the system would clear every page of it
/// again for the next file. For one worker, whose buffers come in the same order file after file
/// and fit where the last ones were; those of several would leave gaps. To be called before threads
/// start; without effect where `malloc` takes no wishes.
void recycleFreedMemory();

}  // namespace pelorin::cli
