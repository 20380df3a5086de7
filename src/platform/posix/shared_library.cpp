#include "platform/shared_library.h"

#include <dlfcn.h>

#include <utility>

#include "platform/fault.h"
#include "platform/files.h"

namespace fotomill::platform {

const char* const kModuleExtension = ".so";

namespace {

// Everything is bound now, so that a missing symbol fails here and not inside a picture; nothing of
// it serves others.
void* Open(const char* name, std::string& error) {
  if (FaultDue()) {
    error = "cannot be loaded";
    return nullptr;
  }
  void* handle = dlopen(name, RTLD_NOW | RTLD_LOCAL);
  if (handle == nullptr) {
    const char* text = dlerror();
    error = text != nullptr ? text : "cannot be loaded";
  }
  return handle;
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
    handle_ = Open(name.c_str(), error_);
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
