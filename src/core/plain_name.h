#pragma once

#include <string_view>

namespace fotomill {

// Whether a text may become a file name, or a part of one, without leading to another folder: no
// "/", "\", "..", zero byte or control character; on Windows no ":" either. An empty text is plain.
bool IsPlainName(std::string_view text);

}  // namespace fotomill
