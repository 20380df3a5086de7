#pragma once

#include <png.h>

namespace fotomill {

// What reader and writer share of libpng.
inline constexpr char kPngXmpKeyword[] = "XML:com.adobe.xmp";
inline constexpr double kPngInchesPerMeter = 39.3701;  // PNG states pixels per meter

// The library's errors end here: they are told by the status, never printed.
[[noreturn]] inline void OnPngError(png_structp png, png_const_charp) { png_longjmp(png, 1); }
inline void OnPngWarning(png_structp, png_const_charp) {}  // nothing is printed

// Runs library calls; false when one of them failed. Nothing with a destructor may live inside
// `action`.
template <typename Action>
bool PngGuarded(png_structp png, Action action) {
  if (setjmp(png_jmpbuf(png)) != 0) return false;
  action();
  return true;
}

}  // namespace fotomill
