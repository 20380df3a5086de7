#include "desktop/models/shell/session.h"

#include <algorithm>

#include "core/data_folder.h"
#include "core/text.h"
#include "platform/files.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr uint64_t kLongestFile = 1024 * 1024;
constexpr size_t kMostTabs = 200;

bool FitsLine(std::string_view text) {
  return text.find_first_of(std::string_view("\n\r\0", 3)) == std::string_view::npos;
}

int32_t Number(std::string_view value) {
  return static_cast<int32_t>(std::clamp<int64_t>(LeadingInteger(value), INT32_MIN, INT32_MAX));
}

void ReadFrameValue(Session& session, std::string_view key, std::string_view value) {
  if (key == "Width") session.width = Number(value);
  if (key == "Height") session.height = Number(value);
  if (key == "Maximized") session.maximized = Number(value) != 0;
  if (key == "Columns") session.columns = value;
  if (key == "Tab") session.tab = static_cast<size_t>(std::max(Number(value), 0));
}

void ReadTabValue(SessionTab& tab, std::string_view key, std::string_view value) {
  if (key == "Folder") tab.folder = value;
  if (key == "ThumbnailMode") tab.view.modes.thumbnails = Number(value);
  if (key == "ViewMode") tab.view.modes.view = Number(value);
  if (key == "SortMode") tab.view.modes.sort = Number(value);
  if (key == "Descending") tab.view.descending = Number(value) != 0;
  if (key == "Scroll") tab.scroll = std::max<int64_t>(LeadingInteger(value), 0);
  if (key == "Focus") tab.focus = value;
  if (key == "AskForThumbnails") tab.asksForThumbnails = Number(value) != 0;
}

std::string Line(const char* key, std::string_view value) {
  return std::string(key).append("=").append(value).append("\n");
}
std::string Line(const char* key, int64_t value) { return Line(key, std::to_string(value)); }

}  // namespace

Session ParseSession(std::string_view text) {
  Session session;
  bool inTab = false;
  while (!text.empty()) {
    const size_t end = std::min(text.find('\n'), text.size());
    std::string_view line = text.substr(0, end);
    text.remove_prefix(std::min(end + 1, text.size()));
    if (line.ends_with('\r')) line.remove_suffix(1);
    if (line == "[Frame]" || line == "[Tab]") {
      inTab = line == "[Tab]" && session.tabs.size() < kMostTabs;
      if (inTab) session.tabs.emplace_back();
    }
    const size_t equals = line.find('=');
    if (equals == std::string_view::npos) continue;
    if (inTab) {
      ReadTabValue(session.tabs.back(), line.substr(0, equals), line.substr(equals + 1));
    } else {
      ReadFrameValue(session, line.substr(0, equals), line.substr(equals + 1));
    }
  }
  std::erase_if(session.tabs, [](const SessionTab& tab) { return tab.folder.empty(); });
  return session;
}

std::string SessionText(const Session& session) {
  std::string text = "[Frame]\n" + Line("Width", session.width) + Line("Height", session.height) +
                     Line("Maximized", session.maximized ? 1 : 0) +
                     Line("Tab", static_cast<int64_t>(session.tab));
  if (!session.columns.empty() && FitsLine(session.columns))
    text += Line("Columns", session.columns);
  for (const SessionTab& tab : session.tabs) {
    if (!FitsLine(tab.folder)) continue;
    text += "[Tab]\n" + Line("Folder", tab.folder) +
            Line("ThumbnailMode", tab.view.modes.thumbnails) +
            Line("ViewMode", tab.view.modes.view) + Line("SortMode", tab.view.modes.sort) +
            Line("Descending", tab.view.descending ? 1 : 0) + Line("Scroll", tab.scroll);
    if (FitsLine(tab.focus)) text += Line("Focus", tab.focus);
    if (!tab.asksForThumbnails) text += Line("AskForThumbnails", 0);
  }
  return text;
}

Session LoadSession() {
  std::string text;
  const std::string path = DataFile(settings.TabsetCurrentName);
  if (path.empty() ||
      platform::ReadWholeFile(path, kLongestFile, text) != platform::ReadResult::Done)
    return {};
  Session session = ParseSession(text);
  session.tab = session.tabs.empty() ? 0 : std::min(session.tab, session.tabs.size() - 1);
  return session;
}

bool SaveSession(const Session& session) {
  const std::string path = DataFile(settings.TabsetCurrentName);
  return !path.empty() && platform::MakeFolders(DataFolder()) &&
         platform::WriteWholeFile(path, SessionText(session));
}

}  // namespace fotomill::desktop
