#pragma once

#include <functional>
#include <string>

namespace fotomill::platform {

// Called once for each lock that was waited for two seconds, on the thread that waits, with the
// file's path and who holds the lock: "fotomill (process 123)", or "another program" where the
// system does not tell. After ten seconds the lock is given up. Set before threads begin.
extern std::function<void(const std::string& path, const std::string& holder)> onLongLockWait;

}  // namespace fotomill::platform
