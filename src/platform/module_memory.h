#pragma once

#include <cstdint>
#include <span>

namespace fotomill::platform {

// Memory blocks passed to or from plug-in modules: movable
// global memory on Windows, malloc() elsewhere. The size of a
// handle is always taken from the system, never from the module.

// The bytes of a handle, empty if it cannot be locked. Valid until UnlockModuleBlock.
std::span<uint8_t> LockModuleBlock(void* handle);
void UnlockModuleBlock(void* handle);  // the bytes may move afterwards
void FreeModuleBlock(void* handle);  // invalidates the handle
// A new block with a copy of `bytes`, null if memory runs out.
void* NewModuleBlock(std::span<const uint8_t> bytes);
// A new block of undefined contents, null if memory runs out.
void* NewModuleMemory(uint64_t bytes);

}  // namespace fotomill::platform
