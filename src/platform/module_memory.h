#pragma once

#include <cstdint>
#include <span>

namespace fotomill::platform {

// Memory blocks that cross the boundary to plug-in modules: movable global memory on Windows,
// malloc() elsewhere. A handle comes from a module, or goes to one; it is never trusted to be
// larger than the system says it is.

// The bytes behind a handle, empty when it cannot be locked. Valid until UnlockModuleBlock.
std::span<uint8_t> LockModuleBlock(void* handle);
void UnlockModuleBlock(void* handle);  // the bytes may move from here on
void FreeModuleBlock(void* handle);  // the handle means nothing afterwards
// A new block with a copy of `bytes`, null without memory.
void* NewModuleBlock(std::span<const uint8_t> bytes);

}  // namespace fotomill::platform
