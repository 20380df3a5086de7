#pragma once

#include <string>
#include <string_view>

#include "core/status.h"

namespace fotomill {

struct FormatEntry;
struct PictureRecord;

// The detected type of a file ("AVIF"), if
// it differs from its name; empty otherwise.
std::string_view LooksLike(const std::string& fileName, int32_t formatIndex);
// A remark about a picture that was opened by contents because its extension is wrong; empty for
// others.
std::string MisnamedRemark(const PictureRecord& picture);

// A hint to follow the message for a file that could not
// be opened or decoded: its detected type, what the build
// lacks, or the format of its extension. May be empty.
std::string OpenHint(const std::string& fileName, Status status);

// The complete error message with its hint.
std::string FailureText(const std::string& fileName, Status status);

// A hint to follow the message if operations
// failed: what this system lacks. May be empty.
std::string WorkHint(Status status);

// The size limits of the format, if this picture exceeds them; else empty.
std::string SizeHint(const PictureRecord& picture, const FormatEntry& row);

}  // namespace fotomill
