#pragma once

#include <cstdint>
#include <string_view>

namespace fotomill {

// Result of every codec, registry and batch operation. The number indexes the user message table.
enum class [[nodiscard]] Status : int32_t{
#define STATUS(number, name, message) name = number,
#include "core/status.def"
#undef STATUS
};

// The number of a status in JSON, the plug-in interface and the manual.
constexpr int32_t StatusNumber(Status status) { return static_cast<int32_t>(status); }

// The user message of a status, "Ok" for success; empty for numbers outside the table, which
// plug-ins may return.
constexpr std::string_view StatusMessage(Status status) {
  switch (status) {
#define STATUS(number, name, message) \
  case Status::name:                  \
    return message;
#include "core/status.def"
#undef STATUS
  }
  return {};
}

// Returns any status but Ok to the caller.
#define RETURN_IF_BAD(expression)                                                           \
  do {                                                                                      \
    if (const ::fotomill::Status status_ = (expression); status_ != ::fotomill::Status::Ok) \
      return status_;                                                                       \
  } while (false)

}  // namespace fotomill
