#pragma once

#include <png.h>

namespace fotomill {

// Shared by reader and writer.
inline constexpr char kPngXmpKeyword[] = "XML:com.adobe.xmp";
inline constexpr double kPngInchesPerMeter = 39.3701;  // PNG stores pixels per meter

// Error handler: errors are reported by the status, never printed.
[[noreturn]] inline void OnPngError(png_structp png, png_const_charp) { png_longjmp(png, 1); }
inline void OnPngWarning(png_structp, png_const_charp) {}  // warnings are not printed

// Runs library calls; false if one of them failed. `action` must not contain
// objects with destructors.
template <typename Action>
bool PngGuarded(png_structp png, Action action) {
  if (setjmp(png_jmpbuf(png)) != 0) return false;
  action();
  return true;
}

}  // namespace fotomill
