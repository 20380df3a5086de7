#include "core/ini_file.h"

#include <algorithm>
#include <unordered_map>

#include "platform/paths.h"

namespace fotomill {

namespace {

// Windows editors write it before UTF-8
constexpr std::string_view kByteOrderMark = "\xEF\xBB\xBF";
constexpr std::string_view kBlanks = " \t";

struct Line {
  std::string_view text;  // without the line ending
  std::string_view end;   // "\n" or "\r\n"; at the end of the file also "\r" or empty
};

// Removes the first line from the text.
Line TakeLine(std::string_view& rest) {
  const size_t feed = rest.find('\n');
  const size_t size = feed == std::string_view::npos ? rest.size() : feed + 1;
  size_t length = std::min(feed, rest.size());
  if (length > 0 && rest[length - 1] == '\r') --length;
  const Line line{rest.substr(0, length), rest.substr(length, size - length)};
  rest.remove_prefix(size);
  return line;
}

std::string_view TrimBlanks(std::string_view text) {
  const size_t first = text.find_first_not_of(kBlanks);
  if (first == std::string_view::npos) return {};
  return text.substr(first, text.find_last_not_of(kBlanks) + 1 - first);
}

// The section name of a section line, nullopt for other lines.
std::optional<std::string_view> SectionOf(std::string_view line) {
  line = TrimBlanks(line.starts_with(kByteOrderMark) ? line.substr(kByteOrderMark.size()) : line);
  const size_t close = line.find(']');
  if (!line.starts_with('[') || close == std::string_view::npos) return std::nullopt;
  return line.substr(1, close - 1);
}

// The entry on a line; false for comments and other lines.
bool EntryOf(std::string_view line, IniEntry& entry) {
  const size_t equals = line.find('=');
  if (equals == std::string_view::npos) return false;
  entry.key = TrimBlanks(line.substr(0, equals));
  entry.value = line.substr(equals + 1);
  return !entry.key.empty() && entry.key.front() != ';' && entry.key.front() != '#';
}

// Copies the text line by line, applying the changes.
class IniEditor {
 public:
  IniEditor(std::string_view section, std::span<const IniEdit> edits)
      : section_(section), edits_(edits) {
    for (const IniEdit& edit : edits) open_.emplace(edit.key, &edit);
  }

  std::string Edit(std::string_view text) {
    out_.reserve(text.size() + 64 * edits_.size());
    std::string_view rest = text;
    while (!rest.empty()) CopyLine(TakeLine(rest));
    if (inside_ && !placeFound_) RememberPlace();
    InsertNewKeys();
    return std::move(out_);
  }

 private:
  void CopyLine(const Line& line) {
    if (lineEnd_.empty() && line.end.ends_with('\n')) lineEnd_ = line.end;
    if (const auto name = SectionOf(line.text)) {
      if (inside_ && !placeFound_) RememberPlace();
      inside_ = *name == section_;
      Copy(line);
      lastEntry_ = out_.size();
    } else if (IniEntry entry; inside_ && EntryOf(line.text, entry)) {
      CopyEntry(line, entry);
      lastEntry_ = out_.size();
    } else {
      Copy(line);
    }
  }

  void CopyEntry(const Line& line, const IniEntry& entry) {
    const auto found = open_.find(entry.key);
    if (found == open_.end()) {
      Copy(line);
    } else if (const IniEdit& edit = *found->second; edit.value) {
      out_.append(line.text.data(), entry.value.data());
      out_ += *edit.value;
      out_ += line.end;
      open_.erase(found);  // later lines of that key are ignored by readers and kept
    }
  }

  void Copy(const Line& line) {
    out_ += line.text;
    out_ += line.end;
  }

  // New keys are inserted after the last entry of the section's first part, before comments that
  // may belong to the next section.
  void RememberPlace() {
    place_ = lastEntry_;
    placeFound_ = true;
  }

  void InsertNewKeys() {
    if (lineEnd_.empty()) lineEnd_ = platform::kLineEnd;
    std::string lines;
    for (const IniEdit& edit : edits_) {
      if (!edit.value || !open_.contains(edit.key)) continue;
      lines.append(edit.key).append("=").append(*edit.value).append(lineEnd_);
    }
    if (lines.empty()) return;
    if (!placeFound_) {
      place_ = out_.size();
      lines.insert(0, std::string("[").append(section_).append("]").append(lineEnd_));
    }
    if (place_ > 0 && out_[place_ - 1] == '\r') {
      lines.insert(0, 1, '\n');
    } else if (place_ > 0 && out_[place_ - 1] != '\n') {
      lines.insert(0, lineEnd_);
    }
    out_.insert(place_, lines);
  }

  std::string_view section_;
  std::span<const IniEdit> edits_;
  std::unordered_map<std::string_view, const IniEdit*> open_;  // pending changes
  std::string out_;
  std::string_view lineEnd_;
  bool inside_ = false;
  bool placeFound_ = false;
  size_t place_ = 0;      // in out_
  size_t lastEntry_ = 0;  // end of the last section line or entry in out_
};

}  // namespace

IniReader::IniReader(std::string_view text, std::string_view section)
    : rest_(text), section_(section) {}

bool IniReader::Next(IniEntry& entry) {
  while (!rest_.empty()) {
    const Line line = TakeLine(rest_);
    ++line_;
    if (const auto name = SectionOf(line.text)) {
      inside_ = *name == section_;
    } else if (inside_ && EntryOf(line.text, entry)) {
      entry.line = line_;
      return true;
    }
  }
  return false;
}

std::optional<std::string_view> FindIniValue(std::string_view text, std::string_view section,
                                             std::string_view key) {
  IniReader reader(text, section);
  for (IniEntry entry; reader.Next(entry);) {
    if (entry.key == key) return entry.value;
  }
  return std::nullopt;
}

std::string EditIni(std::string_view text, std::string_view section,
                    std::span<const IniEdit> edits) {
  return IniEditor(section, edits).Edit(text);
}

bool IsWideText(std::string_view text) {
  return text.starts_with("\xFF\xFE") || text.starts_with("\xFE\xFF");
}

}  // namespace fotomill
