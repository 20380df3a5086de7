#pragma once

#include <atomic>
#include <string>

#include "platform/held_file.h"
#include "platform/output_file.h"

namespace fotomill::platform {

// Replaces `path` with the file `temporary` if `path` is still what `expected` says;
// otherwise returns Taken and leaves it. After Done, and only then, `temporary` no longer
// exists; after Failed with `keep` set, it holds the only copy of what another program has
// written, and must be kept.
CommitResult ReplaceExpected(const std::string& temporary, const std::string& path,
                             const FileStamp& expected, bool& keep);

// The first method to try: atomically exchange both names,
// else hard-link the old file and check it afterwards,
// else check it before. Tests start further down the list.
enum class ReplaceWay { Exchange, Link, Look };
extern std::atomic<ReplaceWay> replaceWay;
// Test hook, called between checking and replacing the old file; otherwise null.
extern std::atomic<void (*)(const std::string& path)> beforeReplacing;

}  // namespace fotomill::platform
