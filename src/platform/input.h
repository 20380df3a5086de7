#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <string>

#include "platform/files.h"

namespace fotomill::platform {

// Reads available standard input, at most the size of the buffer; blocks until there is some. 0 at
// the end; nullopt on an error, or if the program was asked to end.
std::optional<size_t> ReadInput(std::span<uint8_t> buffer);

// Reads a whole file of at most `most` bytes; a FIFO or the
// pipe of a process substitution works, too. Failed also if the
// program was asked to end. `contents` is empty unless Done.
ReadResult ReadListFile(const std::string& path, uint64_t most, std::string& contents);

}  // namespace fotomill::platform
