#include "plugins/facts_cache.h"

#include <algorithm>
#include <string_view>

#include "core/data_folder.h"
#include "core/limits.h"
#include "platform/files.h"
#include "plugins/bad_modules.h"

namespace fotomill {

namespace {

// The first line; another one, of another version of the file, makes it empty.
constexpr std::string_view kHead = "Plug-in facts 1\n";

std::string CacheFile() { return DataFile("PluginFacts.txt"); }

}  // namespace

// Behind the first line, for each module: a line "[" KEY "]" and its facts.
FactsCache::FactsCache() {
  std::string text;
  if (platform::ReadWholeFile(CacheFile(), limits.listFileBytes, text) !=
          platform::ReadResult::Done ||
      !text.starts_with(kHead))
    return;
  std::string_view rest = std::string_view(text).substr(kHead.size());
  for (std::string* facts = nullptr; !rest.empty();) {
    const std::string_view line = rest.substr(0, rest.find('\n'));
    rest.remove_prefix(std::min(line.size() + 1, rest.size()));
    if (line.starts_with('[') && line.ends_with(']')) {
      facts = &texts_[std::string(line.substr(1, line.size() - 2))];
    } else if (facts != nullptr) {
      facts->append(line).append("\n");
    }
  }
}

bool FactsCache::Find(const std::string& path, ModuleFacts& facts) const {
  const auto found = texts_.find(BadModuleLine(path));
  return found != texts_.end() && FactsFromText(found->second, facts);
}

void FactsCache::Put(const std::string& path, const ModuleFacts& facts) {
  const std::string key = BadModuleLine(path);
  if (key.empty()) return;
  // of an older file of that path
  std::erase_if(texts_, [&path](const auto& known) { return known.first.ends_with(" " + path); });
  texts_[key] = FactsAsText(facts);
  changed_ = true;
}

void FactsCache::Save() {
  if (!changed_ || CacheFile().empty() || !platform::IsFolder(DataFolder())) return;
  std::string text(kHead);
  for (const auto& [key, facts] : texts_) text.append("[").append(key).append("]\n").append(facts);
  (void)platform::WriteWholeFile(CacheFile(), text);
  changed_ = false;
}

}  // namespace fotomill
