#include "cli/selection/file_selection.h"

#include <algorithm>
#include <set>
#include <utility>

#include "cli/frame/destination_format.h"
#include "cli/frame/options.h"
#include "cli/selection/file_order.h"
#include "cli/selection/left_out_files.h"
#include "cli/selection/standard_input.h"
#include "core/limits.h"
#include "core/natural_order.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/input.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "registry/registry.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

constexpr int kDeepestFolder = 64;

// Reads a list from standard input; false if it is too long or reading fails.
bool ReadInputList(const Io& io, std::string& contents) {
  uint8_t buffer[16384];
  for (;;) {
    const auto count = ReadInput(io, buffer);
    if (!count) return false;
    if (*count == 0) return true;
    contents.append(reinterpret_cast<const char*>(buffer), *count);
    if (contents.size() > limits.listFileBytes) return false;
  }
}

std::vector<std::string> SplitList(std::string_view list, char end) {
  std::vector<std::string> names;
  while (!list.empty()) {
    const size_t place = list.find(end);
    std::string_view name = list.substr(0, place);
    if (end == '\n' && name.ends_with('\r')) name.remove_suffix(1);
    if (!name.empty()) names.emplace_back(name);
    list.remove_prefix(place == std::string_view::npos ? list.size() : place + 1);
  }
  return names;
}

// The path of a folder relative to the current one, or to the root if it is elsewhere. Never
// contains "..".
std::string FolderFromHere(const std::string& folder) {
  const std::string path = platform::AbsolutePath(folder.empty() ? "." : folder);
  std::string_view rest = path;
  const std::string here = platform::JoinFolder(platform::CurrentFolder(), "");
  if (platform::JoinFolder(path, "") == here) return {};
  if (rest.starts_with(here)) return std::string(rest.substr(here.size()));
  rest.remove_prefix(platform::SplitPath(rest).drive.size());
  while (rest.starts_with(platform::kSeparator)) rest.remove_prefix(1);
  return std::string(rest);
}

class Selector {
 public:
  explicit Selector(const SelectionOptions& options) : options_(options) {}

  void Add(const std::string& name) {
    if (platform::IsFolder(name)) {
      AddTree(name, {});
    } else {
      AddNamed(name, {});
    }
  }
  // For names from a list: with --keep-tree, output folders are relative to the current one.
  void AddListed(const std::string& name) {
    if (platform::IsFolder(name)) {
      AddTree(name, FolderFromHere(name));
    } else {
      AddNamed(name, FolderFromHere(platform::FolderOf(name)));
    }
  }
  void AddInput(const Io& io) {
    input_ = std::make_shared<StandardInput>();
    files_.push_back(input_->Take(io, options_.from));
  }
  Selection Take() {
    SortFiles(options_.sort, files_);
    if (options_.reverse) std::ranges::reverse(files_);
    return {std::move(files_), leftOut_.Line(), std::move(input_)};
  }

 private:
  void AddNamed(const std::string& name, const std::string& below) {
    if (platform::FactsOf(name).kind == platform::FileKind::Missing) {
      files_.push_back({name, below, Status::FileOpenError, Tr("The file does not exist.")});
    } else {
      files_.push_back({name, below, Status::Ok, {}});
    }
  }

  void AddTree(const std::string& folder, const std::string& below) {
    const platform::FileFacts facts = platform::FactsOf(folder);
    trail_ = {{facts.device, facts.identity}};
    AddFolder(folder, below, 0);
  }

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
      if (platform::PendingExit() != 0) return;
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

  // Archives are read only when named: most have no pictures.
  static bool IsPicture(int32_t format) {
    return format != kNoFormat && CanRead(FormatRow(format)) &&
           (FormatRow(format).flags & FMT_ARCHIVE) == 0;
  }

  void AddFile(const std::string& path, const std::string& below, bool hidden) {
    if (!IsPicture(FindReaderByName(path))) {
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

  // Skips a folder that is its own ancestor, as can happen with mounts.
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
  std::set<std::pair<uint64_t, uint64_t>> trail_;  // the current folder and its parents
  std::vector<SelectedFile> files_;
  LeftOutFiles leftOut_;
  std::shared_ptr<StandardInput> input_;
};

// Checks the use of standard input. Returns an error message, empty if valid.
std::string CheckInput(SelectionOptions& options, const CommandContext& context) {
  const auto named =
      options.takesInput ? std::ranges::count(context.names.values, std::string(kStream)) : 0;
  if (named == 0)
    return options.from.empty() ? std::string() : Tr("--from is for standard input, named \"-\".");
  if (named > 1 || options.filesFrom == kStream) return Tr("Standard input can be read only once.");
  if (context.io.inTerminal) return Tr("Standard input is a terminal; pipe a picture into it.");
  return options.from.empty() ? std::string() : ReadSourceFormat(options.from, options.from);
}

// Reads the list for --files-from. Returns an error message, empty on success.
std::string ReadList(const SelectionOptions& options, const CommandContext& context,
                     std::string& list) {
  if (options.filesFrom.empty()) return {};
  if (options.filesFrom == kStream) {
    return ReadInputList(context.io, list)
               ? std::string()
               : Tr("The list of names on standard input cannot be read.");
  }
  const auto result = platform::ReadListFile(options.filesFrom, limits.listFileBytes, list);
  return result == platform::ReadResult::Done
             ? std::string()
             : WithReason(Tr("The list of names \"%1\" cannot be read.", options.filesFrom));
}

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
  if (options.takesInput) {
    AddName(app, "--from", options.from, "EXT",
            "Format of standard input, \"-\", if its contents do not tell");
  }
  AddFlag(app, "-0,--null", options.zeroTerminated,
          "Names in that file are separated by NUL (find -print0)");
}

bool NamesInput(const CommandContext& context) {
  return std::ranges::find(context.names.values, kStream) != context.names.values.end();
}

std::optional<Selection> SelectFiles(const SelectionOptions& given, const CommandContext& context) {
  SelectionOptions options = given;
  std::string list;
  std::string wrong = CheckInput(options, context);
  if (wrong.empty()) wrong = ReadList(options, context, list);
  if (wrong.empty() && options.filesFrom.empty() && context.names.values.empty())
    wrong = Tr("No files given.");
  if (!wrong.empty()) {
    UsageError(context, wrong);
    return std::nullopt;
  }
  Selector selector(options);
  for (const std::string& name : context.names.values) {
    if (options.takesInput && name == kStream) {
      selector.AddInput(context.io);
    } else {
      selector.Add(name);
    }
  }
  for (const std::string& name : SplitList(list, options.zeroTerminated ? '\0' : '\n'))
    selector.AddListed(name);
  return selector.Take();
}

}  // namespace fotomill::cli
