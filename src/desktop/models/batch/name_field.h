#pragma once

#include <string>

namespace fotomill::desktop {

// The field of the name prompt, which shows an output's name without its extension: that is the
// format's, and is told beside the field.

// What the field shows of a path: the name alone for a file of `folder`, folder and name otherwise.
std::string NameInField(const std::string& path, const std::string& folder);
// The path that a text of the field means. The extension may have been typed as well.
std::string PathOfField(const std::string& text, const std::string& extension);

}  // namespace fotomill::desktop
