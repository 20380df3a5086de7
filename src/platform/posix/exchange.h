#pragma once

#include <atomic>
#include <string>

#include "platform/held_file.h"
#include "platform/output_file.h"

namespace fotomill::platform {

// Puts the file `temporary` in the place of `path`, which must still be what `expected` says: Taken
// when it is not, and then stays. After Done, and only then, there is no `temporary` any more;
// after Failed with `keep` set it holds the only copy of what another program has written, and must
// stay.
CommitResult ReplaceExpected(const std::string& temporary, const std::string& path,
                             const FileStamp& expected, bool& keep);

// The first way that is tried: one step that exchanges both names, else a second name for the old
// file by which it is looked at afterwards, else a look before. Tests begin further down than the
// system would need to.
enum class ReplaceWay { Exchange, Link, Look };
extern std::atomic<ReplaceWay> replaceWay;
// Called between the look at the old file and the step that replaces it; for tests, null otherwise.
extern std::atomic<void (*)(const std::string& path)> beforeReplacing;

}  // namespace fotomill::platform
