#include "platform/programs.h"

#include <gio/gdesktopappinfo.h>
#include <gio/gio.h>

#include <algorithm>
#include <memory>

namespace fotomill::platform {

namespace {

struct Releaser {
  void operator()(gpointer object) const { g_object_unref(object); }
  void operator()(GList* objects) const { g_list_free_full(objects, g_object_unref); }
  void operator()(char* text) const { g_free(text); }
};
template <typename T>
using Owned = std::unique_ptr<T, Releaser>;

void Add(GAppInfo* info, std::vector<Program>& programs) {
  const char* const id = g_app_info_get_id(info);
  if (id == nullptr || g_desktop_app_info_get_boolean(G_DESKTOP_APP_INFO(info), "Terminal") != 0)
    return;
  Program program{g_app_info_get_name(info), id};
  if (std::ranges::find(programs, program) == programs.end())
    programs.push_back(std::move(program));
}

}  // namespace

std::vector<Program> ProgramsFor(const std::string& file) {
  const Owned<char> type(g_content_type_guess(file.c_str(), nullptr, 0, nullptr));
  if (g_content_type_is_unknown(type.get()) != 0) return {};
  std::vector<Program> programs;
  if (const Owned<GAppInfo> usual{g_app_info_get_default_for_type(type.get(), 0)})
    Add(usual.get(), programs);
  const Owned<GList> all(g_app_info_get_recommended_for_type(type.get()));
  for (const GList* entry = all.get(); entry != nullptr; entry = entry->next)
    Add(G_APP_INFO(entry->data), programs);
  return programs;
}

bool OpenWith(const Program& program, const std::vector<std::string>& files) {
  const Owned<GDesktopAppInfo> info(g_desktop_app_info_new(program.id.c_str()));
  if (info == nullptr) return false;
  GList* list = nullptr;
  for (auto file = files.rbegin(); file != files.rend(); ++file)
    list = g_list_prepend(list, g_file_new_for_path(file->c_str()));
  const Owned<GList> owner(list);
  return g_app_info_launch(G_APP_INFO(info.get()), list, nullptr, nullptr) != 0;
}

}  // namespace fotomill::platform
