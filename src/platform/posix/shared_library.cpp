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

// Binds all symbols now, so that a missing one fails here and not while decoding; exports none of
// them to others.
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

// Whether `count` items of `size` bytes at `offset` are within the file.
bool Holds(uint64_t fileSize, uint64_t offset, uint64_t count, uint64_t size) {
  return offset <= fileSize && (size == 0 || count <= (fileSize - offset) / size);
}

// Whether the file contains everything its headers refer to. The loader does not check: a library
// truncated by an interrupted copy crashes the program when code past its end is accessed. Files
// that are not libraries are left for the loader to reject.
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
    // Stays loaded until the program ends: its global state is kept, and none of its code is called
    // after unloading.
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
