#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <string>

#include "platform/files.h"

namespace fotomill::platform {

// Reads what has come on the standard input so far, at most the size of the buffer; waits if there
// is nothing yet. 0 at its end; nullopt if it cannot be read, or the program was asked to end.
std::optional<size_t> ReadInput(std::span<uint8_t> buffer);

// Reads a whole file of at most `most` bytes, which may also be a FIFO or the pipe of a process
// substitution. Failed also when the program was asked to end meanwhile. `contents` is empty unless
// Done.
ReadResult ReadListFile(const std::string& path, uint64_t most, std::string& contents);

}  // namespace fotomill::platform
