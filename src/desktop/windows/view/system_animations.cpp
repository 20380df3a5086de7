#include "desktop/windows/view/system_animations.h"

#include "platform/shared_library.h"

namespace fotomill::desktop {

// wxWidgets has no function for it; under GTK it is a property of GtkSettings, read with the
// libraries wxWidgets has loaded.
bool SystemAnimates() {
  platform::SharedLibrary gtk, objects;
  if (!gtk.LoadSystem("libgtk-3.so.0") || !objects.LoadSystem("libgobject-2.0.so.0")) return true;
  auto* const settings = gtk.FunctionNamed<void*()>("gtk_settings_get_default");
  auto* const get = objects.FunctionNamed<void(void*, const char*, ...)>("g_object_get");
  void* const object = settings == nullptr ? nullptr : settings();
  int animates = 1;
  if (object != nullptr && get != nullptr) get(object, "gtk-enable-animations", &animates, nullptr);
  return animates != 0;
}

}  // namespace fotomill::desktop
