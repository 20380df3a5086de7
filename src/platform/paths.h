#pragma once

#include <string>
#include <string_view>

namespace fotomill::platform {

// The four parts of a path; concatenated in this order they give the path again. Views into the
// original text.
struct PathParts {
  std::string_view drive;      // "C:" on Windows, always empty elsewhere
  std::string_view folder;     // with its trailing separator, or empty
  std::string_view base;       // name without the extension
  std::string_view extension;  // with its dot, or empty; starts at the last dot of the name
};

// Splits at the last separator and the last
// dot after it. Purely textual.
PathParts SplitPath(std::string_view path);
// Concatenates the parts.
std::string JoinPath(const PathParts& parts);
// `folder` and `name` joined by one separator; just the name if the folder is empty.
std::string JoinFolder(std::string_view folder, std::string_view name);
// The name with extension, without drive and folder.
std::string_view FileNameOf(std::string_view path);
// Drive and folder, with trailing separator; empty for a bare name.
std::string FolderOf(std::string_view path);
// The extension without the dot.
std::string_view ExtensionOf(std::string_view path);

extern const char kSeparator;            // '/' or '\\'
extern const std::string_view kLineEnd;  // of text files: "\n" or "\r\n"

}  // namespace fotomill::platform
