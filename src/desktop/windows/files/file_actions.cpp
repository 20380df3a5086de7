#include "desktop/windows/files/file_actions.h"

#include <wx/clipbrd.h>
#include <wx/dataobj.h>
#include <wx/frame.h>
#include <wx/image.h>
#include <wx/msgdlg.h>
#include <wx/textdlg.h>

#include <algorithm>
#include <memory>

#include "core/plain_name.h"
#include "core/text.h"
#include "desktop/models/files/operation_options.h"
#include "desktop/models/files/pasted_picture.h"
#include "desktop/models/files/tag_files.h"
#include "desktop/models/files/turn_one_file.h"
#include "desktop/models/files/uri_list.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/archive/archive_folders.h"
#include "desktop/windows/dialogs/folder_dialog.h"
#include "desktop/windows/files/delete_dialog.h"
#include "desktop/windows/files/file_list_data.h"
#include "desktop/windows/history/use_recorder.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/wx_text.h"
#include "metadata/tags/tag_lines.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/rights.h"
#include "settings/configuration.h"
#include "settings/history_list.h"
#include "settings/search_options.h"
#include "settings/settings.h"
#include "texts/grouped_count.h"
#include "texts/status_text.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

PastedPicture PictureOf(const wxBitmap& bitmap) {
  const wxImage image = bitmap.ConvertToImage();
  const size_t count =
      static_cast<size_t>(image.GetWidth()) * static_cast<size_t>(image.GetHeight());
  PastedPicture picture;
  picture.pixels.width = image.GetWidth();
  picture.pixels.height = image.GetHeight();
  picture.pixels.bytes.assign(image.GetData(), image.GetData() + 3 * count);
  if (image.HasAlpha()) picture.alpha.assign(image.GetAlpha(), image.GetAlpha() + count);
  return picture;
}

// "cut" or "copy", then one URL per line
constexpr const char* kGnomeFiles = "x-special/gnome-copied-files";
constexpr size_t kMostFailuresShown = 10;

FileOperation TrashOf(const std::vector<std::string>& paths) {
  return PlanFileOperation(FileOperationKind::Trash, paths, {}, FileOperationOptionsFromSettings());
}

std::vector<std::string> PathsOf(const FileOperation& operation) {
  std::vector<std::string> paths;
  for (const FileStep& step : operation.steps) paths.push_back(step.from);
  return paths;
}

// With an upper-case first letter, in any language.
std::string Capitalized(const std::string& text) {
  const wxString shown = Shown(text);
  return Utf8(shown.Left(1).Upper() + shown.Mid(1));
}

std::string Count(size_t files) { return TrGroupedCount("%1 file", "%1 files", files); }

}  // namespace

FileActions::FileActions(Shell& shell) : shell_(shell), undo_(UndoLimitFromSettings()) {}

void FileActions::SettingsChanged() { undo_.SetLimit(UndoLimitFromSettings()); }

wxWindow* FileActions::ParentOf(const Asker& asker) const {
  return asker.parent != nullptr ? asker.parent.get() : &shell_.Window();
}

void FileActions::Run(const std::string& what, Work work, Then then, const Asker& asker) {
  if (busy_) return shell_.Report(Tr("Please wait for the previous file operation."));
  busy_ = true;
  const auto result = std::make_shared<FileOperationResult>();
  const auto run = [this, what, work = std::move(work), result](const StopToken& stop) {
    *result = work([this, &what, &stop](size_t index, size_t count) {
      CallAfter([this, what, index, count] {
        if (count > 1) shell_.Report(Tr("%1: %2 of %3", what, index + 1, count));
      });
      return !stop.Asked();
    });
    return Status::Ok;
  };
  task_.Start(
      Lane::Blocking, run, [this, what, result, asker, then = std::move(then)](Status status) {
        if (status != Status::Ok) result->failures.push_back({what, StatusText(status)});
        CallAfter(
            [this, what, result, asker, then] { Finished(what, std::move(*result), then, asker); });
      });
}

void FileActions::Finished(const std::string& what, FileOperationResult result, const Then& then,
                           const Asker& asker) {
  busy_ = false;
  const std::string done =
      result.failures.empty() ? what : Tr("%1, %2 failed", what, result.failures.size());
  shell_.Report(result.note.empty() ? done : done + ": " + result.note);
  LogEvent("files", what + " done=" + std::to_string(result.done.steps.size()) +
                        " failed=" + std::to_string(result.failures.size()));
  const std::vector<FileOperationFailure> failures = result.failures;
  then(std::move(result));
  shell_.FilesChanged();
  StartTagging();
  ReportFailures(failures, ParentOf(asker));
}

void FileActions::ReportFailures(const std::vector<FileOperationFailure>& failures,
                                 wxWindow* parent) {
  if (failures.empty()) return;
  wxString text;
  for (size_t i = 0; i < std::min(failures.size(), kMostFailuresShown); ++i) {
    text += Shown(platform::FileNameOf(failures[i].path)) + ": " + Shown(failures[i].reason) + "\n";
  }
  if (failures.size() > kMostFailuresShown)
    text += LabelCount("and %1 more", "and %1 more", failures.size() - kMostFailuresShown);
  LogEvent("prompt", "failures");
  wxMessageBox(text, Label("Some files failed"), wxOK | wxICON_WARNING, parent);
}

void FileActions::Do(FileOperationKind kind, const std::vector<std::string>& paths,
                     const std::string& folder) {
  if (paths.empty()) return;
  std::vector<std::string> changed{folder};
  if (kind == FileOperationKind::Move) changed.insert(changed.end(), paths.begin(), paths.end());
  if (RefusesChange(&shell_.Window(), changed)) return;
  const FileOperation name{kind, std::vector<FileStep>(paths.size(), FileStep{paths.front(), {}})};
  Run(
      Capitalized(FileOperationName(name)),
      [kind, paths, folder,
       options = FileOperationOptionsFromSettings()](const FileOperationProgress& progress) {
        return CarryOut(PlanFileOperation(kind, paths, folder, options), progress);
      },
      [this](FileOperationResult result) {
        Took(result.done, false);
        SelectResults(result.done, false);
        undo_.Add(std::move(result.done));
      });
}

// Selects the files that an operation or its undo made, moved or changed. After an undo that
// removed them, nothing is selected.
void FileActions::SelectResults(const FileOperation& operation, bool back) {
  const bool makes =
      operation.kind == FileOperationKind::Copy || operation.kind == FileOperationKind::Create;
  std::vector<std::string> paths;
  for (const FileStep& step : operation.steps)
    paths.push_back(step.to.empty() || (back && !makes) ? step.from : step.to);
  if (operation.kind != FileOperationKind::Trash || back) shell_.Tabs().SelectWhenListed(paths);
}

void FileActions::Follow(const FileOperation& operation, bool back) {
  if (operation.kind != FileOperationKind::Rename && operation.kind != FileOperationKind::Move)
    return;
  for (const FileStep& step : operation.steps)
    shell_.FollowRename(back ? step.to : step.from, back ? step.from : step.to);
}

void FileActions::Took(const FileOperation& operation, bool back) {
  Follow(operation, back);
  shell_.Uses().Note(UsesOf(operation, back));
  if (operation.kind != FileOperationKind::Tag) return;
  std::vector<std::string> paths;
  for (const FileStep& step : operation.steps) paths.push_back(step.from);
  shell_.Tabs().TagsChanged(paths);
}

// --- tags ---

void FileActions::Tag(const std::vector<std::string>& paths, const TagChanges& changes) {
  if (paths.empty() || RefusesChange(&shell_.Window(), paths)) return;
  tagging_.push_back({paths, changes});
  StartTagging();
}

// One after the other, so that quick keys are not lost.
void FileActions::StartTagging() {
  if (busy_ || tagging_.empty()) return;
  const Tagging next = std::move(tagging_.front());
  tagging_.pop_front();
  const FileOperation name{
      FileOperationKind::Tag,
      std::vector<FileStep>(next.paths.size(), FileStep{next.paths.front(), {}})};
  Run(
      Capitalized(FileOperationName(name)),
      [next, options = TagFilesOptionsFromSettings()](const FileOperationProgress& progress) {
        return TagFiles(next.paths, next.changes, options, progress);
      },
      [this](FileOperationResult result) {
        Took(result.done, false);
        undo_.Add(std::move(result.done));
      });
}

void FileActions::Trash(const std::vector<std::string>& paths) {
  Trash(TrashOf(paths), {});
}

void FileActions::TrashSteps(wxWindow* parent, std::vector<FileStep> steps) {
  FileOperation operation = TrashOf({});
  operation.steps = std::move(steps);
  Trash(operation, {parent, {}});
}

// Finds out in the background whether there is a trash, too.
void FileActions::Trash(const FileOperation& operation, const Asker& asker) {
  if (operation.steps.empty() || RefusesChange(ParentOf(asker), PathsOf(operation))) return;
  const auto noTrash = std::make_shared<bool>(false);
  Run(
      Capitalized(FileOperationName(operation)),
      [operation, noTrash](const FileOperationProgress& progress) {
        const std::string& first = operation.steps.front().from;
        *noTrash = platform::FileExists(first) && platform::MayBeMoved(first) &&
                   !platform::HasTrash(first);
        return *noTrash ? FileOperationResult{{FileOperationKind::Trash, {}}, {}}
                        : CarryOut(operation, progress);
      },
      [this, operation, asker, noTrash](FileOperationResult result) {
        if (*noTrash)
          return CallAfter([this, operation, asker] { Delete(operation, asker, true); });
        Took(result.done, false);
        const bool all = result.done.steps.size() == operation.steps.size();
        undo_.Add(std::move(result.done));
        if (all && asker.gone) asker.gone();
      },
      asker);
}

void FileActions::TrashFromView(wxWindow* view, const std::string& path,
                                std::function<void()> gone) {
  if (busy_) return wxBell();
  if (RefusesChange(view, {path})) return;
  if (settings.PromptDeleteFromView != 0) {
    wxMessageDialog dialog(view, Label("Move %1 to the trash?", Shown(platform::FileNameOf(path))),
                           Label("Delete"), wxOK | wxCANCEL | wxICON_QUESTION);
    dialog.SetOKLabel(Label("&Delete"));
    if (dialog.ShowModal() != wxID_OK) return;
  }
  Trash(TrashOf({path}), {view, std::move(gone)});
}

void FileActions::Delete(const std::vector<std::string>& paths) {
  Delete(TrashOf(paths), {}, false);
}

void FileActions::Delete(const FileOperation& operation, const Asker& asker, bool noTrash) {
  const std::vector<std::string> paths = PathsOf(operation);
  if (paths.empty() || RefusesChange(ParentOf(asker), paths)) return;
  const wxString what = paths.size() == 1 ? "\"" + Shown(platform::FileNameOf(paths.front())) + "\""
                                          : Shown(Count(paths.size()));
  const wxString why =
      noTrash ? Label("There is no trash for files of this folder.") + "\n" : wxString();
  const wxString question = why + Label("Delete %1 permanently? This cannot be undone.", what);
  if (!AskToDelete(*ParentOf(asker), question, paths, shell_.Thumbnails())) return;
  Run(
      Tr("Permanent deletion"),
      [operation](const FileOperationProgress& progress) {
        return DeleteForGood(operation, progress);
      },
      [this, asker, count = paths.size()](FileOperationResult result) {
        Took(result.done, false);
        if (asker.gone && result.done.steps.size() == count) asker.gone();
      },
      asker);
}

void FileActions::CopyTo(const std::vector<std::string>& paths, const std::string& folder) {
  Do(FileOperationKind::Copy, paths, folder);
}
void FileActions::MoveTo(const std::vector<std::string>& paths, const std::string& folder) {
  Do(FileOperationKind::Move, paths, folder);
}

void FileActions::Drop(const std::vector<std::string>& paths, const std::string& folder,
                       bool move) {
  std::vector<std::string> others = paths;
  std::erase(others, folder);  // a slip of the mouse drops a folder on itself
  // out of an archive, files are copied
  const bool unpacked = !paths.empty() && !ArchiveOfFolder(paths.front()).empty();
  Do(move && !unpacked ? FileOperationKind::Move : FileOperationKind::Copy, others, folder);
}

void FileActions::Rename(const std::string& path, const std::string& name) {
  if (RefusesChange(&shell_.Window(), {path})) return;
  if (!IsPlainName(name)) {
    wxMessageBox(
        Label("A name cannot contain \"%1\".", Shown(std::string(1, platform::kSeparator))),
        Label("Rename"), wxOK | wxICON_WARNING, &shell_.Window());
    return;
  }
  RenameAll({{path, platform::JoinFolder(platform::SplitPath(path).folder, name)}});
}

void FileActions::RenameAll(std::vector<FileStep> steps) {
  if (steps.empty()) return;
  FileOperation operation{FileOperationKind::Rename, std::move(steps),
                          FileOperationOptionsFromSettings().commentExtension};
  Run(
      Tr("Rename"),
      [operation](const FileOperationProgress& progress) { return CarryOut(operation, progress); },
      [this](FileOperationResult result) {
        Took(result.done, false);
        SelectResults(result.done, false);
        undo_.Add(std::move(result.done));
      });
}

void FileActions::NewFolder(const std::string& parent) {
  if (RefusesChange(&shell_.Window(), {parent})) return;
  wxTextEntryDialog dialog(&shell_.Window(), Label("Name of the new folder:"), Label("New folder"),
                           wxString::FromUTF8(settings.NewFolderName.c_str()));
  if (dialog.ShowModal() != wxID_OK) return;
  const std::string name = Utf8(dialog.GetValue());
  const std::string path = platform::JoinFolder(parent, name);
  if (!IsPlainName(name) || name.empty() || platform::FileExists(path) ||
      !platform::MakeFolders(path)) {
    wxMessageBox(Label("The folder could not be created."), Label("New folder"),
                 wxOK | wxICON_WARNING, &shell_.Window());
    return;
  }
  if (BrowserPage* browser = shell_.Tabs().Front();
      browser != nullptr && browser->Model().Folder() == parent)
    browser->Open(parent, name);
  shell_.FilesChanged();
}

bool FileActions::SaveTurned(const std::string& path, Orientation turn, Turned then) {
  if (busy_ || RefusesChange(&shell_.Window(), {path})) return false;
  const auto work = [path, turn](const FileOperationProgress&) { return TurnOneFile(path, turn); };
  Run(Tr("Rotation of %1", platform::FileNameOf(path)), work,
      [this, then = std::move(then)](FileOperationResult result) {
        const bool done = !result.done.steps.empty();
        const std::string note = result.note;
        Took(result.done, false);
        undo_.Add(std::move(result.done));
        then(done, note);
      });
  return true;
}

// --- undo ---

void FileActions::Undo() {
  if (!undo_.CanUndo() || busy_) return;
  const FileOperation operation = undo_.PopUndo();
  Run(
      Tr("Undo %1", FileOperationName(operation)),
      [operation](const FileOperationProgress& progress) { return Revert(operation, progress); },
      [this](FileOperationResult result) {
        Took(result.done, true);
        SelectResults(result.done, true);
        undo_.NotUndone({result.done.kind, std::move(result.left), result.done.commentExtension});
        undo_.Undone(std::move(result.done));
      });
}

void FileActions::Redo() {
  if (!undo_.CanRedo() || busy_) return;
  const FileOperation operation = undo_.PopRedo();
  Run(
      Tr("Redo %1", FileOperationName(operation)),
      [operation](const FileOperationProgress& progress) { return CarryOut(operation, progress); },
      [this](FileOperationResult result) {
        Took(result.done, false);
        SelectResults(result.done, false);
        undo_.NotRedone({result.done.kind, std::move(result.left), result.done.commentExtension});
        undo_.Redone(std::move(result.done));
      });
}

// --- clipboard ---

void FileActions::ToClipboard(const std::vector<std::string>& paths, bool cut) {
  if (paths.empty()) return;
  auto* files = new FileListData(paths);
  std::string urls = cut ? "cut" : "copy";
  for (const std::string& path : paths) urls += "\n" + UriOf(path);
  auto* marked = new wxCustomDataObject(wxDataFormat(kGnomeFiles));
  marked->SetData(urls.size(), urls.data());
  auto* both = new wxDataObjectComposite;
  both->Add(files, true);
  both->Add(marked);
  const wxClipboardLocker clipboard;
  if (!clipboard || !wxTheClipboard->SetData(both)) return wxBell();
  if (!cut) shell_.Uses().NoteAll(paths, FileFunction::CopyToClipboard);
  shell_.Report(cut ? TrGroupedCount("%1 file cut.", "%1 files cut.", paths.size())
                    : TrGroupedCount("%1 file copied.", "%1 files copied.", paths.size()));
}

void FileActions::PathsToClipboard(const std::vector<std::string>& paths) {
  wxString text;
  for (const std::string& path : paths) text += (text.empty() ? "" : "\n") + Shown(path);
  const wxClipboardLocker clipboard;
  if (!clipboard || !wxTheClipboard->SetData(new wxTextDataObject(text))) wxBell();
}

void FileActions::Paste(const std::string& folder) {
  if (busy_) return shell_.Report(Tr("Please wait for the previous file operation."));
  if (RefusesChange(&shell_.Window(), {folder})) return;
  FileListData files;
  wxCustomDataObject marked{wxDataFormat(kGnomeFiles)};
  bool cut = false;
  {
    const wxClipboardLocker clipboard;
    if (!clipboard) return wxBell();
    if (!wxTheClipboard->GetData(files) || files.Paths().empty()) return PastePicture(folder);
    if (wxTheClipboard->GetData(marked)) {
      cut = std::string(static_cast<const char*>(marked.GetData()), marked.GetSize())
                .starts_with("cut");
    }
    if (cut) wxTheClipboard->Clear();  // they can be moved only once
  }
  Do(cut ? FileOperationKind::Move : FileOperationKind::Copy, files.Paths(), folder);
}

// The clipboard must be open.
void FileActions::PastePicture(const std::string& folder) {
  wxBitmapDataObject bitmap;
  if (!wxTheClipboard->GetData(bitmap) || !bitmap.GetBitmap().IsOk()) {
    return shell_.Report(Tr("The clipboard has no files and no picture."));
  }
  Run(
      Tr("Paste"),
      [picture = PictureOf(bitmap.GetBitmap()), folder](const FileOperationProgress&) {
        return KeepPastedPicture(picture, folder);
      },
      [this](FileOperationResult result) {
        const std::vector<FileStep> made = result.done.steps;
        undo_.Add(std::move(result.done));
        BrowserPage* const browser = shell_.Tabs().Front();
        if (browser != nullptr && !made.empty())
          browser->Open(browser->Model().Folder(), std::string(platform::FileNameOf(made[0].to)));
      });
}

// --- menu functions ---

void TrashSelection(Shell& shell) { shell.Files().Trash(shell.Tabs().SelectedPaths()); }
void DeleteSelection(Shell& shell) { shell.Files().Delete(shell.Tabs().SelectedPaths()); }

namespace {

void AskAndDo(Shell& shell, const wxString& verb, const wxString& question,
              void (FileActions::*action)(const std::vector<std::string>&, const std::string&)) {
  const std::vector<std::string> paths = shell.Tabs().SelectedPaths();
  if (paths.empty()) return;
  // pictures that were found usually go where those of the last search went
  const BrowserPage* const browser = shell.Tabs().Front();
  const bool found = browser != nullptr && browser->ShowsFound();
  const auto folder = AskForFolder(shell.Window(), question, verb, HistoryList::MoveCopy,
                                   found ? SearchDestinationFromSettings() : std::string());
  if (!folder) return;
  if (found) {
    RememberSearchDestination(*folder);
    (void)SaveConfiguration();
  }
  (shell.Files().*action)(paths, *folder);
}

}  // namespace

void CopySelectionTo(Shell& shell) {
  const size_t count = shell.Tabs().SelectedPaths().size();
  AskAndDo(shell, Label("Copy"), LabelCount("Copy %1 file to", "Copy %1 files to", count),
           &FileActions::CopyTo);
}
void MoveSelectionTo(Shell& shell) {
  const size_t count = shell.Tabs().SelectedPaths().size();
  AskAndDo(shell, Label("Move"), LabelCount("Move %1 file to", "Move %1 files to", count),
           &FileActions::MoveTo);
}

namespace {

// The tags of a single picture, to start with.
PictureTags TagsOfOne(const std::vector<std::string>& files) {
  PictureTags tags;
  if (files.size() == 1) (void)ReadPictureTags(files.front(), {}, tags);
  return tags;
}

wxString NameOfAll(const std::vector<std::string>& files) {
  return files.size() == 1 ? Shown(platform::FileNameOf(files.front()))
                           : Shown(Count(files.size()));
}

}  // namespace

void CommentSelection(Shell& shell) {
  const std::vector<std::string> files = shell.Tabs().SelectedFiles();
  if (files.empty()) return;
  wxTextEntryDialog dialog(&shell.Window(), Label("Comment for %1:", NameOfAll(files)),
                           Label("Comment"), Shown(TagsOfOne(files).description),
                           wxTextEntryDialogStyle | wxTE_MULTILINE);
  LogEvent("prompt", "comment");
  if (dialog.ShowModal() != wxID_OK) return;
  TagChanges changes;
  changes.description = Utf8(dialog.GetValue());
  shell.Files().Tag(files, changes);
}

void KeywordSelection(Shell& shell) {
  const std::vector<std::string> files = shell.Tabs().SelectedFiles();
  if (files.empty()) return;
  const bool one = files.size() == 1;
  const wxString name = NameOfAll(files);
  wxTextEntryDialog dialog(&shell.Window(),
                           one ? Label("Keywords for %1, separated by commas:", name)
                               : Label("Keywords to add to %1, separated by commas:", name),
                           Label("Keywords"), Shown(KeywordText(TagsOfOne(files))));
  LogEvent("prompt", "keywords");
  if (dialog.ShowModal() != wxID_OK) return;
  TagChanges changes;
  const std::vector<std::string> keywords = ListedKeywords(Utf8(dialog.GetValue()));
  if (one) changes.keywords = keywords;
  if (!one) changes.addedKeywords = keywords;
  if (!changes.Empty()) shell.Files().Tag(files, changes);
}

}  // namespace fotomill::desktop
