#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <string_view>

namespace fotomill::cli {

// Counts the files of folders that a command leaves out, by extension.
class LeftOutFiles {
 public:
  // A file that no format of this build reads. Those that the program itself keeps beside pictures
  // do not count.
  void Add(std::string_view name);
  void AddHidden() { ++hidden_; }
  // "8 other files were left out: 3 .mov, 1 .heic, ..."; empty if there were none.
  std::string Line() const;

 private:
  std::map<std::string, uint64_t, std::less<>> kinds_;  // by extension with its dot, in lower case
  uint64_t hidden_ = 0;
};

}  // namespace fotomill::cli
