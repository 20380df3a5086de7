#pragma once

#include <string>
#include <string_view>

#include "core/status.h"

namespace fotomill {

struct FormatEntry;
struct PictureRecord;

// What a file looks like by its first bytes ("AVIF"), where that is not what its name says; empty
// otherwise.
std::string_view LooksLike(const std::string& fileName, int32_t formatIndex);
// A sentence about a picture that was opened by its contents, since its name lies; empty for
// others.
std::string MisnamedRemark(const PictureRecord& picture);

// What follows the message of a file that could not be opened or decoded: what it looks like,
// what the build lacks, or which format its name should have selected. Empty when there is nothing
// to add.
std::string OpenHint(const std::string& fileName, Status status);

// That message with what follows it, for people.
std::string FailureText(const std::string& fileName, Status status);

// What follows the message of a picture that operations failed on: what this system lacks. May be
// empty.
std::string WorkHint(Status status);

// What size pictures of the row can have, if this one does not fit; empty if it does.
std::string SizeHint(const PictureRecord& picture, const FormatEntry& row);

}  // namespace fotomill
