#include "cli/selection/file_selection.h"

#include <algorithm>
#include <set>
#include <utility>

#include "cli/selection/file_order.h"
#include "cli/selection/left_out_files.h"
#include "cli/frame/options.h"
#include "core/limits.h"
#include "core/natural_order.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "registry/registry.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

constexpr int kDeepestFolder = 64;

// Reads a whole stream, up to the limit of list files; false if it is longer or cannot be read.
bool ReadStream(std::FILE* stream, std::string& contents) {
  char buffer[16384];
  while (const size_t count = std::fread(buffer, 1, sizeof buffer, stream)) {
    contents.append(buffer, count);
    if (contents.size() > limits.listFileBytes) return false;
  }
  return std::ferror(stream) == 0;
}

std::vector<std::string> SplitList(std::string_view list, char end) {
  std::vector<std::string> names;
  while (!list.empty()) {
    const size_t place = list.find(end);
    if (place != 0) names.emplace_back(list.substr(0, place));
    list.remove_prefix(place == std::string_view::npos ? list.size() : place + 1);
  }
  return names;
}

class Selector {
 public:
  explicit Selector(const SelectionOptions& options) : options_(options) {}

  void Add(const std::string& name) {
    const platform::FileFacts facts = platform::FactsOf(name);
    if (facts.kind == platform::FileKind::Folder) {
      trail_.clear();
      trail_.insert({facts.device, facts.identity});
      AddFolder(name, {}, 0);
    } else if (facts.kind == platform::FileKind::Missing) {
      files_.push_back({name, {}, Status::FileOpenError, Tr("The file does not exist.")});
    } else {
      files_.push_back({name, {}, Status::Ok, {}});
    }
  }
  Selection Take() {
    SortFiles(options_.sort, files_);
    if (options_.reverse) std::ranges::reverse(files_);
    return {std::move(files_), leftOut_.Line()};
  }

 private:
  void AddFolder(const std::string& folder, const std::string& below, int depth) {
    auto entries = platform::ListFolder(folder);
    if (!entries) {
      files_.push_back(
          {folder, below, Status::FileOpenError, WithReason(Tr("The folder cannot be read."))});
      return;
    }
    if (options_.sort.empty()) {
      std::ranges::sort(*entries, [](const auto& a, const auto& b) {
        return CompareNatural(a.name, b.name) < 0;
      });
    }
    for (const platform::FolderEntry& entry : *entries) {
      const std::string path = platform::JoinFolder(folder, entry.name);
      const bool hidden = !options_.hidden && platform::IsHidden(path);
      if (entry.kind == platform::FileKind::Folder) {
        if (options_.recursive && !entry.link && !hidden)
          Descend(path, platform::JoinFolder(below, entry.name), depth + 1);
      } else if (IsFile(entry, path)) {
        AddFile(path, below, hidden);
      }
    }
  }

  void AddFile(const std::string& path, const std::string& below, bool hidden) {
    const int32_t format = FindFormatByName(path);
    if (format == kNoFormat || !CanRead(FormatRow(format))) {
      if (!hidden) leftOut_.Add(path);
    } else if (hidden) {
      leftOut_.AddHidden();
    } else {
      files_.push_back({path, below, Status::Ok, {}});
    }
  }

  static bool IsFile(const platform::FolderEntry& entry, const std::string& path) {
    return entry.kind == platform::FileKind::Regular ||
           (entry.link && platform::IsRegularFile(path));
  }

  // Skips a folder that is its own ancestor, which mounts can cause.
  void Descend(const std::string& folder, const std::string& below, int depth) {
    if (depth > kDeepestFolder) {
      files_.push_back(
          {folder, below, Status::FileOpenError, Tr("The folders are nested too deeply.")});
      return;
    }
    const platform::FileFacts facts = platform::FactsOf(folder);
    const auto [place, fresh] = trail_.insert({facts.device, facts.identity});
    if (!fresh) return;
    AddFolder(folder, below, depth);
    trail_.erase(place);
  }

  const SelectionOptions& options_;
  std::set<std::pair<uint64_t, uint64_t>> trail_;  // the folder that is being read and its parents
  std::vector<SelectedFile> files_;
  LeftOutFiles leftOut_;
};

}  // namespace

void AddSelection(CLI::App& app, SelectionOptions& options, CommandContext& context) {
  context.names.Declare("FILE...", "Picture files, or folders of pictures", 0);
  AddFlag(app, "-r,--recursive", options.recursive, "Descend into subfolders");
  AddFlag(app, "--hidden", options.hidden, "Include hidden files of folders");
  AddChoice(app, "--sort", options.sort, "BY",
            "Order: name (natural order), time (of modification), taken (EXIF date), size or none (default: files as named, those of folders by name)",
            {"name", "time", "taken", "size", "none"});
  AddFlag(app, "--reverse", options.reverse, "Reverse that order");
  AddName(app, "--files-from", options.filesFrom, "FILE|-",
          "Read names from a file, one per line; - is standard input");
  AddFlag(app, "-0,--null", options.zeroTerminated,
          "Names in that file are separated by NUL (find -print0)");
}

std::optional<Selection> SelectFiles(const SelectionOptions& options,
                                     const CommandContext& context) {
  Selector selector(options);
  std::string list;
  if (options.filesFrom == "-") {
    if (!ReadStream(context.io.in, list)) {
      UsageError(context, Tr("The list of names on standard input cannot be read."));
      return std::nullopt;
    }
  } else if (!options.filesFrom.empty()) {
    if (platform::ReadWholeFile(options.filesFrom, limits.listFileBytes, list) !=
        platform::ReadResult::Done) {
      UsageError(context, Tr("The list of names \"%1\" cannot be read.", options.filesFrom));
      return std::nullopt;
    }
  } else if (context.names.values.empty()) {
    UsageError(context, Tr("No files given."));
    return std::nullopt;
  }
  for (const std::string& name : context.names.values) selector.Add(name);
  for (const std::string& name : SplitList(list, options.zeroTerminated ? '\0' : '\n'))
    selector.Add(name);
  return selector.Take();
}

}  // namespace fotomill::cli
