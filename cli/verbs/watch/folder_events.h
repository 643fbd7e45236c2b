#pragma once

#include <string>
#include <vector>

namespace pelorin::cli {

/// Tells when something changes in folders: that it did, not what.
class FolderEvents {
 public:
  FolderEvents();
  ~FolderEvents();
  FolderEvents(const FolderEvents&) = delete;
  FolderEvents& operator=(const FolderEvents&) = delete;

  /// Listens to a folder from now on; nothing changes for one that is listened to already.
  /// @returns false where the system has no more listeners.
  bool listenTo(const std::string& folder);

  /// Waits for a change and takes it down, or until the time is over.
  /// @returns whether something has changed.
  bool wait(int milliseconds);

 private:
  int queue_;
};

}  // namespace pelorin::cli
