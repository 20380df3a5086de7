#pragma once

#include <cstdint>
#include <filesystem>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill::test {

// A fresh folder that goes with the test.
class TemporaryFolder {
 public:
  TemporaryFolder();
  ~TemporaryFolder();
  TemporaryFolder(const TemporaryFolder&) = delete;
  TemporaryFolder& operator=(const TemporaryFolder&) = delete;
  std::string Path(std::string_view name = {}) const;
  // Names in the folder, sorted; hidden ones too.
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
// The folder of real pictures that FOTOMILL_CORPUS names, empty when there is none; tests that use
// it skip without it.
std::string CorpusFolder();

}  // namespace fotomill::test
