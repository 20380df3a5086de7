#include "picture/picture_record.h"

#include <cstdarg>
#include <cstdio>
#include <new>
#include <numeric>

namespace fotomill {

void DetailLines::AddFormat(const char* format, ...) {
  char line[kMostCharacters + 1];
  va_list arguments;
  va_start(arguments, format);
  std::vsnprintf(line, sizeof line, format, arguments);
  va_end(arguments);
  Add(line);
}

PicturePointer NewPictureRecord(Color defaultColour, void* window, void* context) {
  PicturePointer picture(new (std::nothrow) PictureRecord);
  if (picture == nullptr) return picture;
  picture->window = window;
  picture->context = context;
  picture->defaultColour = defaultColour;
  std::iota(picture->remap.begin(), picture->remap.end(), uint8_t{0});
  return picture;
}

}  // namespace fotomill
