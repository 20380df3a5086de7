#include "desktop/windows/view/screen_profile.h"

#include <wx/display.h>
#include <wx/window.h>

#include <string>
#include <utility>

#include "desktop/models/shell/event_log.h"
#include "desktop/models/view/view_picture.h"
#include "platform/shared_library.h"

namespace fotomill::desktop {

namespace {

// "ICC Profiles in X", version 0.4; the names of further screens end with their number.
constexpr char kProperty[] = "_ICC_PROFILE";
constexpr size_t kLargestProfile = 8 << 20;
constexpr int kByteFormat = 8;  // bits per value

// wxWidgets has no functions for properties of the root window; uses those of the libraries it has
// loaded.
class Gdk {
 public:
  Gdk() {
    if (!gdk_.LoadSystem("libgdk-3.so.0") || !objects_.LoadSystem("libgobject-2.0.so.0") ||
        !glib_.LoadSystem("libglib-2.0.so.0")) {
      return;
    }
    display_ = gdk_.FunctionNamed<void*()>("gdk_display_get_default");
    x11Display_ = gdk_.FunctionNamed<size_t()>("gdk_x11_display_get_type");
    isA_ = objects_.FunctionNamed<int(void*, size_t)>("g_type_check_instance_is_a");
    root_ = gdk_.FunctionNamed<void*()>("gdk_get_default_root_window");
    atom_ = gdk_.FunctionNamed<void*(const char*, int)>("gdk_atom_intern");
    property_ = gdk_.FunctionNamed<GetProperty>("gdk_property_get");
    free_ = glib_.FunctionNamed<void(void*)>("g_free");
  }

  bool OnX11() const {
    const bool whole = display_ != nullptr && x11Display_ != nullptr && isA_ != nullptr &&
                       root_ != nullptr && atom_ != nullptr && property_ != nullptr &&
                       free_ != nullptr;
    void* const display = whole ? display_() : nullptr;
    return display != nullptr && isA_(display, x11Display_()) != 0;
  }

  std::vector<uint8_t> BytesOfRoot(const char* name) const {
    int format = 0, length = 0;
    uint8_t* data = nullptr;
    std::vector<uint8_t> bytes;
    if (property_(root_(), atom_(name, 0), nullptr, 0, kLargestProfile, 0, nullptr, &format,
                  &length, &data) == 0)
      return bytes;
    if (format == kByteFormat && data != nullptr && length > 0) bytes.assign(data, data + length);
    free_(data);
    return bytes;
  }

 private:
  using GetProperty = int(void* window, void* property, void* type, unsigned long offset,
                          unsigned long length, int remove, void** actualType, int* format,
                          int* count, uint8_t** data);

  platform::SharedLibrary gdk_, objects_, glib_;
  void* (*display_)() = nullptr;
  size_t (*x11Display_)() = nullptr;
  int (*isA_)(void*, size_t) = nullptr;
  void* (*root_)() = nullptr;
  void* (*atom_)(const char*, int) = nullptr;
  GetProperty* property_ = nullptr;
  void (*free_)(void*) = nullptr;
};

}  // namespace

void TakeScreenProfiles() {
  const Gdk gdk;
  std::vector<std::vector<uint8_t>> profiles;
  for (unsigned screen = 0; gdk.OnX11() && screen < wxDisplay::GetCount(); ++screen) {
    const std::string number = screen == 0 ? std::string() : "_" + std::to_string(screen);
    profiles.push_back(gdk.BytesOfRoot((kProperty + number).c_str()));
    LogEvent("screen-profile", std::to_string(profiles.back().size()));
  }
  SetScreenProfiles(std::move(profiles));
}

size_t ScreenOf(const wxWindow& window) {
  const int screen = wxDisplay::GetFromWindow(&window);
  return screen == wxNOT_FOUND ? 0 : static_cast<size_t>(screen);
}

}  // namespace fotomill::desktop
