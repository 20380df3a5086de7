#pragma once

#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill::desktop {

// Converts files for clipboard and drag and drop: "file" URIs, one per line (RFC 2483, section 5;
// RFC 8089). Names may be any bytes; all but plain ASCII is escaped as %XX.
std::string UriOf(std::string_view path);  // of an absolute path
// For the type text/uri-list: lines end with CR LF.
std::string UriList(std::span<const std::string> paths);
// The absolute paths in a list. Comments, files of
// other hosts and other kinds of URIs are ignored.
std::vector<std::string> PathsOfUriList(std::string_view list);

}  // namespace fotomill::desktop
