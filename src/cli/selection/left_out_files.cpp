#include "cli/selection/left_out_files.h"

#include <algorithm>
#include <utility>
#include <vector>

#include "core/text.h"
#include "platform/paths.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

constexpr size_t kMostKinds = 5;

bool IsOwnFile(std::string_view extension) {
  constexpr std::string_view kOwn[] = {"thn", "tdb", "fhdb", "override"};
  return std::ranges::any_of(
      kOwn, [&](std::string_view own) { return EqualIgnoringCase(extension, own); });
}

}  // namespace

void LeftOutFiles::Add(std::string_view name) {
  const std::string_view extension = platform::ExtensionOf(name);
  if (IsOwnFile(extension)) return;
  ++kinds_[extension.empty() ? std::string() : "." + LowerCase(extension)];
}

std::string LeftOutFiles::Line() const {
  std::vector<std::pair<uint64_t, std::string>> kinds;
  uint64_t all = hidden_;
  for (const auto& [extension, count] : kinds_) {
    all += count;
    kinds.emplace_back(count, extension.empty()
                                  ? Tr("%1 without extension", ThousandsText(count))
                                  : ThousandsText(count) + " " + extension);
  }
  if (all == 0) return {};
  std::ranges::stable_sort(kinds, std::ranges::greater{}, &std::pair<uint64_t, std::string>::first);
  std::string list;
  const auto append = [&](const std::string& text) { list += (list.empty() ? "" : ", ") + text; };
  for (size_t i = 0; i < kinds.size() && i < kMostKinds; ++i) append(kinds[i].second);
  if (kinds.size() > kMostKinds) append("...");
  if (hidden_ > 0) append(Tr("%1 hidden", ThousandsText(hidden_)));
  return TrCount("One other file was left out: %2", "%1 other files were left out: %2", all,
                 list);
}

}  // namespace fotomill::cli
