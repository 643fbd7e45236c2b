// A cache and a ledger whose files were damaged: each is opened or refused, and what can be stored is found
// again.
#include <unistd.h>

#include <cstdint>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

#include "fuzz/damage.h"
#include "photo/collection/ledger.h"
#include "photo/collection/photo_cache.h"

using namespace pelorin::photo;
namespace fs = std::filesystem;

namespace {

const FileStamp stamp = {1000, 5};

/// A folder that goes with the process.
class Folder {
 public:
  Folder() : path_(fs::temp_directory_path() / ("fuzz_remembered_" + std::to_string(getpid()))) {
    fs::create_directories(path_);
  }
  ~Folder() {
    std::error_code ignored;
    fs::remove_all(path_, ignored);
  }
  std::string cache() const { return path_ / "cache"; }
  std::string ledger() const { return path_ / "ledger"; }
  void clear() const {
    for (const fs::directory_entry& entry : fs::directory_iterator(path_)) fs::remove(entry);
  }

 private:
  fs::path path_;
};

std::string bytesOf(const std::string& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), {}};
}

void write(const std::string& path, const std::string& bytes) {
  std::ofstream(path, std::ios::binary) << bytes;
}

void useCache(const std::string& path) {
  try {
    PhotoCache cache(path);
    cache.find("a.jpg", stamp, 8);
    cache.findScore("a.jpg", stamp);
    PhotoRecord record{40, 30, 1, {}, {}};
    cache.store("b.jpg", stamp, 8, record);
    const auto found = cache.find("b.jpg", stamp, 8);
    if (!found || found->width != record.width) std::abort();
  } catch (const CacheError&) {
  }
}

void useLedger(const std::string& path) {
  Ledger ledger(path);
  ledger.find("a.jpg");
  const LedgerEntry entry = {stamp, "out.jpg", stamp, false};
  ledger.put("b.jpg", entry);
  const LedgerEntry* const found = ledger.find("b.jpg");
  if (found == nullptr || !(*found == entry)) std::abort();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const Folder folder;
  static const auto good = [] {
    useCache(folder.cache());
    useLedger(folder.ledger());
    return std::pair(bytesOf(folder.cache()), bytesOf(folder.ledger()));
  }();
  folder.clear();
  const std::vector<std::uint8_t> damage(data, data + size);
  const bool cut = size > 1 && data[0] % 4 == 0;
  for (const auto& [path, bytes] :
       {std::pair(folder.cache(), good.first), std::pair(folder.ledger(), good.second)}) {
    std::string bad = damaged(bytes, damage);
    if (cut) bad.resize(bad.size() * data[1] / 256);
    write(path, bad);
  }
  useCache(folder.cache());
  useLedger(folder.ledger());
  return 0;
}
