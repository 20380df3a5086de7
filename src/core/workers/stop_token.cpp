#include "core/workers/stop_token.h"

#include "platform/process.h"

namespace fotomill {

bool StopToken::Asked() const {
  return (stopped_ != nullptr && stopped_->load(std::memory_order_relaxed)) ||
         platform::PendingExit() != 0;
}

}  // namespace fotomill
