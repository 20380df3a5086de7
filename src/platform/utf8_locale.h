#pragma once

namespace fotomill::platform {

// While it exists, C libraries on this thread treat names as UTF-8, regardless of the locale.
class Utf8Locale {
 public:
  Utf8Locale();
  ~Utf8Locale();
  Utf8Locale(const Utf8Locale&) = delete;
  Utf8Locale& operator=(const Utf8Locale&) = delete;

 private:
  void* locale_ = nullptr;  // null if the system has no such locale
  void* previous_ = nullptr;
};

}  // namespace fotomill::platform
