#include "batch/abort.h"

#include <atomic>

#include "platform/process.h"

namespace fotomill {

namespace {

std::atomic<bool> abortFlag{false};

}  // namespace

void ClearAbort() { abortFlag = false; }

void Abort() { abortFlag = true; }

bool AbortAsked() { return abortFlag.load(std::memory_order_relaxed) || platform::PendingExit() != 0; }

}  // namespace fotomill
