#pragma once

#include <functional>
#include <string>

namespace fotomill::platform {

// Called once for each lock after two seconds of waiting, on the waiting thread, with the file's
// path and the lock's holder: "fotomill (process 123)", or "another program" if unknown. After ten
// seconds the wait fails. Must be set before threads are started.
extern std::function<void(const std::string& path, const std::string& holder)> onLongLockWait;

}  // namespace fotomill::platform
