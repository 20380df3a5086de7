#include "platform/reason.h"

#include <cerrno>
#include <system_error>
#include <utility>

#include "platform/posix/kept_reason.h"

namespace fotomill::platform {

namespace {

thread_local std::string reason, lostAttributes;

}  // namespace

const std::string& SystemReason() { return reason; }

void KeepReason(std::string text) { reason = std::move(text); }

void ForgetReason() { reason.clear(); }

void KeepErrno() {
  const int error = errno;
  if (error == 0 || error == ENOENT || error == ENOTDIR || error == EISDIR || error == EINVAL) {
    reason.clear();
  } else {
    reason = std::generic_category().message(error);
  }
  errno = error;
}

void KeepLostAttributes(std::string names) { lostAttributes = std::move(names); }

std::string TakeLostAttributes() { return std::exchange(lostAttributes, {}); }

}  // namespace fotomill::platform
