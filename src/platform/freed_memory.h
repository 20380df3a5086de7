#pragma once

namespace fotomill::platform {

// From now on, freed memory is returned to the system: large blocks at once, the rest by
// TrimFreedMemory. For programs that stay open while others work.
void ReturnFreedMemory();

// Returns unused memory to the system, except for a few pooled blocks; at most twice a second, and
// only after ReturnFreedMemory. Any thread.
void TrimFreedMemory();

}  // namespace fotomill::platform
