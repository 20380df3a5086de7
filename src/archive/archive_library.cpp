#include "archive/archive_library.h"

namespace fotomill {

namespace {

constexpr char kLibraryName[] = "libarchive.so.13";

}  // namespace

ArchiveLibrary::ArchiveLibrary() {
  if (!library.LoadSystem(kLibraryName)) return;
#define FUNCTION(name) name = library.FunctionNamed<decltype(::archive_##name)>("archive_" #name);
  ARCHIVE_FUNCTIONS(FUNCTION)
#undef FUNCTION
}

bool ArchiveLibrary::Whole() const {
#define FUNCTION(name) &&name != nullptr
  return library.Loaded() ARCHIVE_FUNCTIONS(FUNCTION);
#undef FUNCTION
}

const ArchiveLibrary& LibArchive() {
  static const ArchiveLibrary library;
  return library;
}

}  // namespace fotomill
