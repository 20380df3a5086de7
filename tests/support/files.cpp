#include "support/files.h"

#include <algorithm>
#include <atomic>
#include <cstdlib>
#include <fstream>
#include <iterator>

namespace fotomill::test {

namespace fs = std::filesystem;

TemporaryFolder::TemporaryFolder() {
  std::string pattern = (fs::temp_directory_path() / "fmw-test-XXXXXX").string();
  path_ = mkdtemp(pattern.data());
}

TemporaryFolder::~TemporaryFolder() {
  std::error_code ignored;
  fs::remove_all(path_, ignored);
}

std::string TemporaryFolder::Path(std::string_view name) const {
  return name.empty() ? path_.string() : (path_ / name).string();
}

std::vector<std::string> TemporaryFolder::Names() const {
  std::vector<std::string> names;
  for (const auto& entry : fs::directory_iterator(path_))
    names.push_back(entry.path().filename().string());
  std::sort(names.begin(), names.end());
  return names;
}

void WriteBytes(const std::string& path, std::span<const uint8_t> bytes) {
  std::ofstream(path, std::ios::binary)
      .write(reinterpret_cast<const char*>(bytes.data()),
             static_cast<std::streamsize>(bytes.size()));
}

void WriteText(const std::string& path, std::string_view text) {
  WriteBytes(path, {reinterpret_cast<const uint8_t*>(text.data()), text.size()});
}

std::string ReadText(const std::string& path) {
  std::ifstream file(path, std::ios::binary);
  return {std::istreambuf_iterator<char>(file), {}};
}

std::vector<uint8_t> ReadBytes(const std::string& path) {
  const std::string text = ReadText(path);
  return {text.begin(), text.end()};
}

std::string SourcePath(std::string_view relative) {
  return std::string(FOTOMILL_SOURCE_DIR) + "/" + std::string(relative);
}

std::string CorpusFolder() {
  const char* folder = std::getenv("FOTOMILL_CORPUS");
  if (folder != nullptr && fs::is_directory(folder)) return folder;
  return {};
}

}  // namespace fotomill::test
