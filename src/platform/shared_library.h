#pragma once

#include <string>

namespace fotomill::platform {

// A loaded shared library, unloaded with its owner.
class SharedLibrary {
 public:
  SharedLibrary() = default;
  SharedLibrary(SharedLibrary&& other) noexcept;
  SharedLibrary& operator=(SharedLibrary&& other) noexcept;
  ~SharedLibrary() { Unload(); }

  // Loads a module by its absolute path; anything but a regular file is refused, and so is a file
  // that ends before what its headers name. False with `Error()` set.
  [[nodiscard]] bool Load(const std::string& absolutePath);
  // Loads one of the system's own libraries by its bare name ("libjxr.so.0"), wherever the system
  // keeps them.
  [[nodiscard]] bool LoadSystem(const std::string& name);
  bool Loaded() const { return handle_ != nullptr; }  // after Load went well
  // An export's address, null when it has none of that name.
  void* Symbol(const char* name) const;
  // Null when the library has no such function.
  template <typename Function>
  Function* FunctionNamed(const char* name) const {
    return reinterpret_cast<Function*>(Symbol(name));
  }
  // The system's handle, null without a module, and the system's words on why the last Load failed.
  void* Handle() const { return handle_; }
  // The system's words for what Load could not do.
  const std::string& Error() const { return error_; }
  void Unload();  // its functions must not be called any more

 private:
  void* handle_ = nullptr;
  std::string error_;
};

// What modules of this system are called: pattern parts "FMWPL" and ".so" or ".DLL".
extern const char* const kModuleExtension;

}  // namespace fotomill::platform
