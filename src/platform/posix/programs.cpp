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

// The words of an entry's Exec line, including field codes.
std::vector<std::string> ExecWords(GDesktopAppInfo* info) {
  const char* const line = g_app_info_get_commandline(G_APP_INFO(info));
  int count = 0;
  char** parsed = nullptr;
  if (line == nullptr || g_shell_parse_argv(line, &count, &parsed, nullptr) == 0) return {};
  std::vector<std::string> words(parsed, parsed + count);
  g_strfreev(parsed);
  return words;
}

// Expands the field codes in a word, according to the Desktop Entry Specification. URLs are passed
// as paths, which programs accept as well.
std::string ExpandWord(const std::string& word, const Program& program, const std::string& file) {
  std::string expanded;
  for (size_t i = 0; i < word.size(); ++i) {
    if (word[i] != '%' || i + 1 == word.size()) {
      expanded += word[i];
      continue;
    }
    switch (word[++i]) {
      case '%': expanded += '%'; break;
      case 'f':
      case 'u': expanded += file; break;
      case 'c': expanded += program.name; break;
      default: break;  // icon, entry file and deprecated codes
    }
  }
  return expanded;
}

std::vector<std::string> Expand(const std::vector<std::string>& words, const Program& program,
                                const std::vector<std::string>& files) {
  std::vector<std::string> command;
  bool named = false;
  for (const std::string& word : words) {
    const bool list = word == "%F" || word == "%U";
    named = named || list || word.find("%f") != std::string::npos ||
            word.find("%u") != std::string::npos;
    if (list) {
      command.insert(command.end(), files.begin(), files.end());
      continue;
    }
    std::string expanded = ExpandWord(word, program, files.front());
    if (!expanded.empty() || word.empty()) command.push_back(std::move(expanded));
  }
  if (!named) command.push_back(files.front());
  return command;
}

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

std::vector<std::vector<std::string>> CommandsFor(const Program& program,
                                                  const std::vector<std::string>& files) {
  const Owned<GDesktopAppInfo> info(g_desktop_app_info_new(program.id.c_str()));
  if (info == nullptr) return {};
  const std::vector<std::string> words = ExecWords(info.get());
  if (words.empty()) return {};
  const bool several = std::ranges::any_of(
      words, [](const std::string& word) { return word == "%F" || word == "%U"; });
  std::vector<std::vector<std::string>> commands;
  if (several) {
    commands.push_back(Expand(words, program, files));
  } else {
    for (const std::string& file : files) commands.push_back(Expand(words, program, {file}));
  }
  return commands;
}

}  // namespace fotomill::platform
