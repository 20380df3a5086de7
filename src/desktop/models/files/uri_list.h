#pragma once

#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill::desktop {

// Files as programs hand them to each other by clipboard and drag: "file" URIs, one per line (RFC
// 2483, section 5; RFC 8089). Names may be any bytes; what is not plain ASCII is written as %XX.
std::string UriOf(std::string_view path);  // of an absolute path
// As the type text/uri-list has it: each line ends with CR LF.
std::string UriList(std::span<const std::string> paths);
// The absolute paths of a list. Comments, files of other hosts and URIs of other kinds are left
// out.
std::vector<std::string> PathsOfUriList(std::string_view list);

}  // namespace fotomill::desktop
