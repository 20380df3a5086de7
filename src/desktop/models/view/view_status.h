#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

#include "desktop/models/view/view_picture.h"

namespace fotomill::desktop {

// What a view window shows.
struct ViewState {
  size_t place = 0, count = 1;           // of the file in its list, from 0
  const ViewPicture* picture = nullptr;  // null while it is loaded
  int loadedPercent = 0;                 // meanwhile; 0: unknown
  double zoom = 1;                       // screen pixels per picture pixel
  int32_t page = 0;                      // from 0
  bool turned = false;                   // not saved yet
  std::string animation;                 // status of an animation; empty: none
  std::string note;                      // remark on the last function
};

// The text of the status bar: place, size, zoom, page, tags, remarks; or what is wrong.
std::string ViewStatusText(const ViewState& state);

}  // namespace fotomill::desktop
