#pragma once

#include <stdlib.h>

#include <cerrno>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <string_view>
#include <system_error>

namespace nimbo {

/// A folder of the test's own, gone with all that is in it at the end.
class TemporaryFolder final {
 public:
  TemporaryFolder() {
    std::string name = (std::filesystem::temp_directory_path() / "nimbo-test-XXXXXX").native();
    if (!::mkdtemp(name.data())) throw std::system_error(errno, std::generic_category(), name);
    _path = name;
  }
  ~TemporaryFolder() {
    std::error_code ignored;
    std::filesystem::remove_all(_path, ignored);
  }
  TemporaryFolder(const TemporaryFolder&) = delete;
  TemporaryFolder& operator=(const TemporaryFolder&) = delete;

  const std::filesystem::path& path() const { return _path; }

  /// Writes a file below the folder, making the folders on the way; its whole path.
  std::filesystem::path write(const std::filesystem::path& name, std::string_view text) const {
    std::filesystem::create_directories((_path / name).parent_path());
    std::ofstream(_path / name, std::ios::binary) << text;
    return _path / name;
  }

  /// What a file below the folder holds; empty when it is missing.
  std::string read(const std::filesystem::path& name) const {
    std::ifstream stream(_path / name, std::ios::binary);
    return {std::istreambuf_iterator<char>(stream), {}};
  }

 private:
  std::filesystem::path _path;
};

}  // namespace nimbo
