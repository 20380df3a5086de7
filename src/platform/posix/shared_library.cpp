#include "platform/shared_library.h"

#include <dlfcn.h>
#include <elf.h>
#include <fcntl.h>
#include <link.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstring>
#include <utility>

#include "platform/fault.h"
#include "platform/files.h"
#include "platform/posix/handle.h"

namespace fotomill::platform {

const char* const kModuleExtension = ".so";

namespace {

// Everything is bound now, so that a missing symbol fails here and not inside a picture; nothing of
// it serves others.
void* Open(const char* name, std::string& error, int flags = 0) {
  if (FaultDue()) {
    error = "cannot be loaded";
    return nullptr;
  }
  void* handle = dlopen(name, RTLD_NOW | RTLD_LOCAL | flags);
  if (handle == nullptr) {
    const char* text = dlerror();
    error = text != nullptr ? text : "cannot be loaded";
  }
  return handle;
}

template <typename Struct>
bool ReadAt(const Handle& file, uint64_t offset, Struct& read) {
  return pread(file.Number(), &read, sizeof read, static_cast<off_t>(offset)) ==
         static_cast<ssize_t>(sizeof read);
}

// Whether `count` items of `size` bytes from `offset` on end within the file.
bool Holds(uint64_t fileSize, uint64_t offset, uint64_t count, uint64_t size) {
  return offset <= fileSize && (size == 0 || count <= (fileSize - offset) / size);
}

// Whether the file holds every byte that its headers speak of. The system maps a library without
// looking: one that is cut off, as an interrupted copy is, ends the program at the first access
// behind its end. What is no library at all is left to the system to refuse.
bool IsWhole(const std::string& path) {
  struct stat facts;
  const Handle file = OpenRegular(path.c_str(), O_RDONLY, facts);
  if (!file.IsOpen()) return false;
  const auto fileSize = static_cast<uint64_t>(facts.st_size);
  ElfW(Ehdr) header;
  if (!ReadAt(file, 0, header)) return false;
  if (std::memcmp(header.e_ident, ELFMAG, SELFMAG) != 0 ||
      header.e_ident[EI_CLASS] != (sizeof(void*) == 8 ? ELFCLASS64 : ELFCLASS32) ||
      header.e_phentsize != sizeof(ElfW(Phdr)))
    return true;
  if (!Holds(fileSize, header.e_phoff, header.e_phnum, sizeof(ElfW(Phdr))) ||
      !Holds(fileSize, header.e_shoff, header.e_shnum, header.e_shentsize))
    return false;
  for (uint64_t i = 0; i < header.e_phnum; ++i) {
    ElfW(Phdr) segment;
    if (!ReadAt(file, header.e_phoff + i * sizeof segment, segment)) return false;
    if (!Holds(fileSize, segment.p_offset, 1, segment.p_filesz)) return false;
  }
  return true;
}

}  // namespace

SharedLibrary::SharedLibrary(SharedLibrary&& other) noexcept
    : handle_(std::exchange(other.handle_, nullptr)), error_(std::move(other.error_)) {}

SharedLibrary& SharedLibrary::operator=(SharedLibrary&& other) noexcept {
  if (this != &other) {
    Unload();
    handle_ = std::exchange(other.handle_, nullptr);
    error_ = std::move(other.error_);
  }
  return *this;
}

bool SharedLibrary::Load(const std::string& absolutePath) {
  Unload();
  error_.clear();
  if (!absolutePath.starts_with('/')) {
    error_ = "not an absolute path";
  } else if (!IsRegularFile(absolutePath)) {
    error_ = "not a regular file";
  } else if (!IsWhole(absolutePath)) {
    error_ = "cut off";
  } else {
    handle_ = Open(absolutePath.c_str(), error_);
  }
  return Loaded();
}

bool SharedLibrary::LoadSystem(const std::string& name) {
  Unload();
  error_.clear();
  if (name.empty() || name.find('/') != std::string::npos) {
    error_ = "not a bare name";
  } else {
    // It stays until the program ends: what such a library keeps for itself is not lost, and
    // nothing of it is called after it went.
    handle_ = Open(name.c_str(), error_, RTLD_NODELETE);
  }
  return Loaded();
}

void* SharedLibrary::Symbol(const char* name) const {
  return Loaded() ? dlsym(handle_, name) : nullptr;
}

void SharedLibrary::Unload() {
  if (Loaded()) dlclose(std::exchange(handle_, nullptr));
}

}  // namespace fotomill::platform
