#pragma once

#include <string>

namespace fotomill::desktop {

// The field of the name prompt shows an output's name without its extension, which is that of the
// format and is shown beside the field.

// The field's text for a path: only the name for a file in `folder`, otherwise folder and name.
std::string NameInField(const std::string& path, const std::string& folder);
// The path for the field's text, which may include the extension. It is relative to the folder of
// `offered`, the path that the field showed first.
std::string PathOfField(const std::string& text, const std::string& extension,
                        const std::string& offered);

}  // namespace fotomill::desktop
