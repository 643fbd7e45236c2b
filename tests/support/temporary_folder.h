#pragma once

#include <stdlib.h>

#include <cstdint>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <set>
#include <stdexcept>
#include <string>
#include <vector>

#include "tests/support/bytes.h"

namespace pelorin::test_support {

/// A folder of a test's own, gone with it.
class TemporaryFolder {
 public:
  TemporaryFolder() {
    std::string pattern = (std::filesystem::temp_directory_path() / "quenby-XXXXXX").string();
    if (mkdtemp(pattern.data()) == nullptr) throw std::runtime_error("mkdtemp");
    path_ = pattern;
  }
  ~TemporaryFolder() {
    std::error_code ignored;
    std::filesystem::remove_all(path_, ignored);
  }
  TemporaryFolder(const TemporaryFolder&) = delete;
  TemporaryFolder& operator=(const TemporaryFolder&) = delete;

  std::string operator/(const std::string& name) const { return (path_ / name).string(); }
  std::string path() const { return path_.string(); }

  /// A new file; its folders are made too.
  std::string write(const std::string& name, const Bytes& bytes) const {
    std::filesystem::create_directories((path_ / name).parent_path());
    std::ofstream stream(path_ / name, std::ios::binary);
    stream.write(reinterpret_cast<const char*>(bytes.data()),
                 static_cast<std::streamsize>(bytes.size()));
    return *this / name;
  }
  std::string write(const std::string& name, const std::string& text) const {
    return write(name, Bytes(text.begin(), text.end()));
  }
  std::string makeFolder(const std::string& name) const {
    std::filesystem::create_directories(path_ / name);
    return *this / name;
  }

  Bytes read(const std::string& name) const {
    std::ifstream stream(path_ / name, std::ios::binary);
    if (!stream) throw std::runtime_error("cannot read " + name);
    return Bytes{std::istreambuf_iterator<char>(stream), {}};
  }
  bool has(const std::string& name) const { return std::filesystem::exists(path_ / name); }

  /// Everything in it, folders with a slash at the end, relative to it.
  std::set<std::string> content() const {
    std::set<std::string> names;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(path_)) {
      names.insert(entry.path().lexically_relative(path_).string() +
                   (entry.is_directory() ? "/" : ""));
    }
    return names;
  }

 private:
  std::filesystem::path path_;
};

}  // namespace pelorin::test_support
