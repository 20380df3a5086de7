#include "settings/key_help.h"

#include "texts/texts.h"

namespace fotomill {

namespace {

// The text below a key's heading.
std::string_view EntryOf(const KeyRow& row) {
  const std::string heading = std::string("\n### ") + row.name + "\n";
  const size_t start = kSettingsPage.find(heading);
  if (start == std::string_view::npos) return {};
  const std::string_view rest = kSettingsPage.substr(start + heading.size());
  return rest.substr(0, rest.find("\n\n"));
}

}  // namespace

std::string KeyHelp(const KeyRow& row) {
  std::string text;
  for (const char c : EntryOf(row)) {
    if (c == '\n') {
      text += ' ';
    } else if (c != '`' && c != '*') {
      text += c;
    }
  }
  while (text.ends_with(' ')) text.pop_back();
  return text;
}

std::string KeySummary(const KeyRow& row) {
  const std::string help = KeyHelp(row);
  const size_t end = help.find(". ");
  return end == std::string::npos ? help : help.substr(0, end + 1);
}

bool IsKeyUsed(const KeyRow& row) { return !EntryOf(row).empty(); }

std::string UnusedKeyText(const KeyRow& row) { return Tr("This build does not use %1.", row.name); }

}  // namespace fotomill
