#pragma once

#include <string>

namespace fotomill::platform {

// A loaded shared library, unloaded by its destructor.
class SharedLibrary {
 public:
  SharedLibrary() = default;
  SharedLibrary(SharedLibrary&& other) noexcept;
  SharedLibrary& operator=(SharedLibrary&& other) noexcept;
  ~SharedLibrary() { Unload(); }

  // Loads a module by its absolute path; fails for anything but a regular file, and for a file
  // shorter than its headers claim. On false, `Error()` is set.
  [[nodiscard]] bool Load(const std::string& absolutePath);
  // Loads a system library by its bare name
  // ("libjxr.so.0") from the system's search path.
  [[nodiscard]] bool LoadSystem(const std::string& name);
  bool Loaded() const { return handle_ != nullptr; }  // true after a successful Load
  // Address of an exported symbol, null if there is none of that name.
  void* Symbol(const char* name) const;
  // Null if the library has no such function.
  template <typename Function>
  Function* FunctionNamed(const char* name) const {
    return reinterpret_cast<Function*>(Symbol(name));
  }
  // The system's handle, null if nothing is loaded.
  void* Handle() const { return handle_; }
  // The system's error message for the last failed Load.
  const std::string& Error() const { return error_; }
  void Unload();  // its functions must not be called afterwards

 private:
  void* handle_ = nullptr;
  std::string error_;
};

// File extension of modules on this system: pattern parts "FMWPL" and ".so" or ".DLL".
extern const char* const kModuleExtension;

}  // namespace fotomill::platform
