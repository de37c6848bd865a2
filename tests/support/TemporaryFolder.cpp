#include "support/TemporaryFolder.h"

#include <cstdlib>
#include <fstream>
#include <iterator>
#include <stdexcept>
#include <system_error>

namespace lumora::tests {

TemporaryFolder::TemporaryFolder() {
  auto name = (std::filesystem::temp_directory_path() / "lumora-test-XXXXXX").string();
  if (!mkdtemp(name.data())) {
    throw std::runtime_error("cannot make " + name);
  }
  path_ = name;
}

TemporaryFolder::~TemporaryFolder() {
  std::error_code ignored;
  std::filesystem::remove_all(path_, ignored);
}

std::string contentOf(const std::filesystem::path& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), {}};
}

void writeFile(const std::filesystem::path& path, std::string_view content) {
  std::ofstream(path, std::ios::binary) << content;
}

} // namespace lumora::tests
