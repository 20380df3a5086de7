#pragma once

#include <string>
#include <string_view>

namespace fotomill::platform {

// The four parts of a path; joined in this order they are the path again. Views into the text that
// was split.
struct PathParts {
  std::string_view drive;      // "C:" on Windows, always empty elsewhere
  std::string_view folder;     // with its closing separator, or empty
  std::string_view base;       // name without the extension
  std::string_view extension;  // with its dot, or empty; the last dot of the name decides
};

// Splits at the last separator and the last dot behind it, and puts parts together again. Nothing
// is asked of the system.
PathParts SplitPath(std::string_view path);
// The parts in their order, with nothing in between.
std::string JoinPath(const PathParts& parts);
// `folder` and `name` with one separator between them; an empty folder gives the name alone.
std::string JoinFolder(std::string_view folder, std::string_view name);
// The name with extension, without drive and folder.
std::string_view FileNameOf(std::string_view path);
// Drive and folder, with their closing separator; empty for a bare name.
std::string FolderOf(std::string_view path);
// The extension without its dot.
std::string_view ExtensionOf(std::string_view path);

extern const char kSeparator;            // '/' or '\\'
extern const std::string_view kLineEnd;  // of text files: "\n" or "\r\n"

}  // namespace fotomill::platform
