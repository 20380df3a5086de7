#include "desktop/windows/widgets/screen_reader.h"

#include <algorithm>
#include <vector>

#include "platform/shared_library.h"

namespace fotomill::desktop {

namespace {

// wxAccessible only works on Windows. Under GTK, screen readers use the accessible objects of the
// widgets, for which wxWidgets has no functions; uses those of the libraries it has loaded.
class Gtk {
 public:
  static const Gtk& The() {
    static const Gtk gtk;
    return gtk;
  }
  bool Here() const { return here_; }

  void SetTexts(void* widget, const char* name, const char* description) const {
    void* const object = accessible_(widget);
    if (object == nullptr) return;
    setName_(object, name);
    if (*description != '\0') setDescription_(object, description);
  }
  // All children of a widget, including internal ones.
  std::vector<void*> PartsOf(void* widget) const {
    std::vector<void*> parts;
    if (isA_(widget, container_()) != 0) {
      forAll_(
          widget,
          [](void* part, void* list) { static_cast<std::vector<void*>*>(list)->push_back(part); },
          &parts);
    }
    return parts;
  }
  bool CanFocus(void* widget) const { return canFocus_(widget) != 0; }

 private:
  using Visit = void(void* part, void* data);

  Gtk() {
    if (!gtk_.LoadSystem("libgtk-3.so.0") || !atk_.LoadSystem("libatk-1.0.so.0") ||
        !objects_.LoadSystem("libgobject-2.0.so.0")) {
      return;
    }
    accessible_ = gtk_.FunctionNamed<void*(void*)>("gtk_widget_get_accessible");
    canFocus_ = gtk_.FunctionNamed<int(void*)>("gtk_widget_get_can_focus");
    forAll_ = gtk_.FunctionNamed<void(void*, Visit*, void*)>("gtk_container_forall");
    container_ = gtk_.FunctionNamed<size_t()>("gtk_container_get_type");
    isA_ = objects_.FunctionNamed<int(void*, size_t)>("g_type_check_instance_is_a");
    setName_ = atk_.FunctionNamed<void(void*, const char*)>("atk_object_set_name");
    setDescription_ = atk_.FunctionNamed<void(void*, const char*)>("atk_object_set_description");
    here_ = accessible_ != nullptr && canFocus_ != nullptr && forAll_ != nullptr &&
            container_ != nullptr && isA_ != nullptr && setName_ != nullptr &&
            setDescription_ != nullptr;
  }

  platform::SharedLibrary gtk_, atk_, objects_;
  bool here_ = false;
  void* (*accessible_)(void*) = nullptr;
  int (*canFocus_)(void*) = nullptr;
  void (*forAll_)(void*, Visit*, void*) = nullptr;
  size_t (*container_)() = nullptr;
  int (*isA_)(void*, size_t) = nullptr;
  void (*setName_)(void*, const char*) = nullptr;
  void (*setDescription_)(void*, const char*) = nullptr;
};

void SetTextsOfParts(void* widget, const std::vector<void*>& windows,
                     const wxScopedCharBuffer& name, const wxScopedCharBuffer& description) {
  const Gtk& gtk = Gtk::The();
  for (void* const part : gtk.PartsOf(widget)) {
    if (std::ranges::find(windows, part) != windows.end()) continue;
    if (gtk.CanFocus(part)) gtk.SetTexts(part, name.data(), description.data());
    SetTextsOfParts(part, windows, name, description);
  }
}

}  // namespace

void ReportToScreenReader(wxWindow& window, const wxString& name, const wxString& description) {
  window.SetName(name);
  void* const widget = window.GetHandle();
  if (widget == nullptr || !Gtk::The().Here()) return;
  const wxScopedCharBuffer nameText = name.utf8_str(), descriptionText = description.utf8_str();
  std::vector<void*> windows;
  for (const wxWindow* const child : window.GetChildren()) windows.push_back(child->GetHandle());
  Gtk::The().SetTexts(widget, nameText.data(), descriptionText.data());
  SetTextsOfParts(widget, windows, nameText, descriptionText);
}

}  // namespace fotomill::desktop
