#pragma once

#include <string>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "picture/read_request.h"

namespace fotomill {

// Decodes every page or frame of a file. DamagedFile (2), with the reason in `hint`, also for a
// picture that can be shown but is incomplete; else the codec's status, FunctionCancelled (4) if
// `stop` is asked. A decoder's remark about an intact file becomes `note`.
Status VerifyPicture(const std::string& name, const ReadOptions& options, std::string& hint,
                     std::string& note, const StopToken& stop = {});

}  // namespace fotomill
