#include "desktop/models/browser/jump_search.h"

#include <string>

#include "core/folded_text.h"
#include "core/text.h"
#include "desktop/models/browser/browser_model.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

// Bytes beyond ASCII count as letters.
bool IsWordLetter(char c) { return IsLetter(c) || (static_cast<uint8_t>(c) & 0x80) != 0; }

bool BeginsWord(std::string_view text, size_t at) {
  if (at == 0) return true;
  const char before = text[at - 1], here = text[at];
  if (!IsWordLetter(before) && !IsDigit(before)) return true;
  return IsDigit(before) != IsDigit(here);
}

bool Contains(std::string_view name, std::string_view part, bool atStart) {
  for (size_t at = name.find(part); at != std::string_view::npos; at = name.find(part, at + 1)) {
    if (!atStart || BeginsWord(name, at)) return true;
  }
  return false;
}

}  // namespace

JumpRules JumpRulesFromSettings() {
  return {.atStart = settings.JumpWindowSearchStart != 0,
          .phrase = settings.JumpWindowSearchPhrase != 0};
}

bool JumpMatches(std::string_view name, std::string_view text, const JumpRules& rules) {
  const std::string folded = FoldCase(name), wanted = FoldCase(text);
  if (rules.phrase) return wanted.empty() || Contains(folded, wanted, rules.atStart);
  std::string_view rest = wanted;
  while (!rest.empty()) {
    const size_t end = std::min(rest.find(' '), rest.size());
    if (end > 0 && !Contains(folded, rest.substr(0, end), rules.atStart)) return false;
    rest.remove_prefix(std::min(end + 1, rest.size()));
  }
  return true;
}

std::vector<FolderItem> JumpTargets(const BrowserModel& model, std::string_view text,
                                    const JumpRules& rules) {
  std::vector<FolderItem> targets;
  for (size_t line = 0; line < model.LineCount(); ++line) {
    if (JumpMatches(ShownName(model.Line(line)), text, rules)) targets.push_back(model.Line(line));
  }
  return targets;
}

}  // namespace fotomill::desktop
