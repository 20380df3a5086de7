#include "batch/run_names.h"

#include <algorithm>
#include <string_view>

#include "batch/destination_name.h"
#include "platform/folders.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

// The path of which `path` may be a numbered variant; empty if it is not one.
std::string OriginOfVariant(const std::string& path) {
  const platform::PathParts parts = platform::SplitPath(path);
  const size_t bracket = parts.base.rfind(" [");
  if (!parts.base.ends_with(']') || bracket == std::string_view::npos) return {};
  return platform::JoinPath(
      {parts.drive, parts.folder, parts.base.substr(0, bracket), parts.extension});
}

}  // namespace

RunNames::RunNames() : folder_(platform::CurrentFolder()) {}

void RunNames::AddSource(const std::string& source) { ++sources_[Key(source)]; }

void RunNames::AddPlanned(const std::string& planned) { ++planned_[Key(planned)]; }

bool RunNames::ConcernsNobodyElse(const std::string& source, const std::string& planned) const {
  const std::string own = Key(source), path = Key(planned), origin = OriginOfVariant(path);
  const auto same = planned_.find(path), read = sources_.find(path);
  if (same != planned_.end() && same->second > 1) return false;
  if (read != sources_.end() && (path != own || read->second > 1)) return false;
  return origin.empty() || !planned_.contains(origin);
}

bool RunNames::IsExpected(const std::string& path) const {
  const std::string key = Key(path);
  return planned_.contains(key) || sources_.contains(key);
}

bool RunNames::IsOutputOfOthers(const std::string& source,
                                std::span<const std::string> planned) const {
  const std::string own = Key(source);
  const auto found = planned_.find(own);
  if (found == planned_.end()) return false;
  return found->second >
         std::ranges::count_if(planned, [&](const std::string& path) { return Key(path) == own; });
}

bool RunNames::TakenByRun(const std::string& path, const std::string& source) const {
  const std::string key = Key(path);
  return given_.contains(key) || (sources_.contains(key) && key != Key(source));
}

platform::Existence RunNames::Taken(const std::string& path, const std::string& source) const {
  return TakenByRun(path, source) ? platform::Existence::Yes : platform::ExistenceOf(path);
}

void RunNames::Give(const std::string& path) { given_.insert(Key(path)); }

void RunNames::Release(const std::string& path) {
  given_.erase(Key(path));
  ForgetVariants();
}

VariantSearch RunNames::MakeVariant(std::string& path, int64_t first, int64_t last,
                                    const TakenTest& taken, const StopToken& stop) {
  int64_t& start = variants_.try_emplace(Key(path), first).first->second;
  int64_t next = start;
  const auto counted = [&](const std::string& variant) {
    ++next;
    return taken(variant);
  };
  const VariantSearch search = MakeNumberedVariant(path, start, last, counted, stop);
  if (search == VariantSearch::Found) start = next;
  return search;
}

std::string RunNames::Key(const std::string& path) const {
  const bool relative =
      platform::SplitPath(path).drive.empty() && !path.starts_with(platform::kSeparator);
  return platform::AbsolutePath(relative ? platform::JoinFolder(folder_, path) : path);
}

}  // namespace fotomill
