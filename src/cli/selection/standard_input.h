#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>

#include "batch/batch_file.h"
#include "cli/frame/io.h"
#include "platform/output_file.h"
#include "platform/temporary_folder.h"

namespace fotomill::cli {

// Name for standard input, or standard output as the destination.
inline constexpr const char* kStream = "-";

// Reads available input up to the size of the buffer; blocks if there is none. 0 at the end;
// nullopt if reading fails or the program should exit.
std::optional<size_t> ReadInput(const Io& io, std::span<uint8_t> buffer);

// A picture from standard input, in a temporary file that is deleted with this object.
class StandardInput {
 public:
  // Reads the picture. The file's extension is its format: `from`, or detected from the contents if
  // empty. Returns the file, or kStream with the reason for the failure.
  BatchFile Take(const Io& io, const std::string& from);
  const std::string& Path() const { return path_; }  // empty before Take or if it failed

 private:
  bool Create(const std::string& extension);

  platform::TemporaryFolder folder_;
  platform::OutputFile file_;
  std::string path_;
};

}  // namespace fotomill::cli
