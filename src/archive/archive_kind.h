#pragma once

#include <cstdint>
#include <span>

namespace fotomill {

// What the first and last bytes of an archive show. Sources: PKWARE, APPNOTE.TXT 6.3.9, sections
// 4.3.6 and 4.3.16; RAR 5.0 archive format (technical note), and the public description of the
// older RAR headers.
struct ArchiveKind {
  enum Type : uint8_t { None, Zip, Rar4, Rar5 } type = None;
  bool volume = false;       // one of several parts
  bool namesLocked = false;  // the names are encrypted as well
};
// `file` is the whole file; only headers are read.
ArchiveKind ArchiveKindOf(std::span<const uint8_t> file);

}  // namespace fotomill
