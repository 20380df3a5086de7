#include "catalog/history/file_moves.h"

#include "platform/paths.h"

namespace fotomill {

void FileMoves::MovedBefore(const std::string& from, const std::string& to) {
  std::string last = PathNow(to).value_or(to);
  now_.erase(to);  // a previous file of that name is a different one
  std::map<std::string, std::string> within = TakeWithin(to);
  (void)TakeWithin(from);  // these are in a later folder of that name
  for (auto& [path, now] : within) now_[from + path.substr(to.size())] = std::move(now);
  now_[from] = std::move(last);
}

void FileMoves::RemovedBefore(const std::string& path) {
  (void)TakeWithin(path);
  now_[path].clear();
}

std::map<std::string, std::string> FileMoves::TakeWithin(const std::string& folder) {
  const std::string start = platform::JoinFolder(folder, "");
  std::map<std::string, std::string> within;
  for (auto next = now_.lower_bound(start); next != now_.end() && next->first.starts_with(start);)
    within.insert(now_.extract(next++));
  return within;
}

// Looks up the path itself, or its nearest known parent folder.
std::optional<std::string> FileMoves::PathNow(std::string_view path) const {
  if (now_.empty()) return std::nullopt;
  for (size_t end = path.size(); end != std::string_view::npos && end > 0;
       end = path.substr(0, end).rfind(platform::kSeparator)) {
    const auto found = now_.find(std::string(path.substr(0, end)));
    if (found == now_.end()) continue;
    return found->second.empty() ? std::string() : found->second + std::string(path.substr(end));
  }
  return std::nullopt;
}

}  // namespace fotomill
