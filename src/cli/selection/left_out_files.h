#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <string_view>

namespace fotomill::cli {

// Counts the files in folders that a command ignores, by extension.
class LeftOutFiles {
 public:
  // Counts a file of unknown format, except for files that the program itself stores beside
  // pictures.
  void Add(std::string_view name);
  void AddHidden() { ++hidden_; }
  // "8 other files were left out: 3 .mov, 1 .heic, ..."; empty if there are none.
  std::string Line() const;

 private:
  std::map<std::string, uint64_t, std::less<>> kinds_;  // by extension with dot, lowercase
  uint64_t hidden_ = 0;
};

}  // namespace fotomill::cli
