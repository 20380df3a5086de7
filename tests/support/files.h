#pragma once

#include <cstdint>
#include <filesystem>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill::test {

// A fresh folder, deleted at the end of the test.
class TemporaryFolder {
 public:
  TemporaryFolder();
  ~TemporaryFolder();
  TemporaryFolder(const TemporaryFolder&) = delete;
  TemporaryFolder& operator=(const TemporaryFolder&) = delete;
  std::string Path(std::string_view name = {}) const;
  // Names in the folder, sorted, including hidden ones.
  std::vector<std::string> Names() const;

 private:
  std::filesystem::path path_;
};

void WriteBytes(const std::string& path, std::span<const uint8_t> bytes);
void WriteText(const std::string& path, std::string_view text);
std::vector<uint8_t> ReadBytes(const std::string& path);
std::string ReadText(const std::string& path);

// A file of this project, such as "samples/plugin".
std::string SourcePath(std::string_view relative);
// The folder of real pictures in FOTOMILL_CORPUS, empty if not set; tests that need it
// are skipped then.
std::string CorpusFolder();

}  // namespace fotomill::test
