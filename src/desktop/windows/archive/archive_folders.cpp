#include "desktop/windows/archive/archive_folders.h"

#include <wx/frame.h>
#include <wx/msgdlg.h>
#include <wx/richmsgdlg.h>

#include <algorithm>
#include <map>
#include <memory>

#include "batch/archive/extract_run.h"
#include "batch/new_job.h"
#include "desktop/models/archive/archive_listing.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/archive/archive_frame.h"
#include "desktop/windows/batch/batch_runner.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/held_file.h"
#include "platform/paths.h"
#include "platform/temporary_folder.h"
#include "settings/configuration.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

// An unpacked archive.
struct Unpacked {
  platform::FileStamp stamp;  // of the archive
  platform::TemporaryFolder home;
  std::string folder;  // in it, named after the archive
};

// By the path of the archive. Only used on the window's thread.
std::map<std::string, std::shared_ptr<Unpacked>>& Kept() {
  static std::map<std::string, std::shared_ptr<Unpacked>> kept;
  return kept;
}

// Unpacks to a new temporary folder; `files` counts the files.
Status Unpack(const std::string& archive, Unpacked& unpacked, size_t& files, BatchJob& job) {
  if (!unpacked.home.Create()) return Status::ErrorCreatingFile;
  unpacked.folder = platform::JoinFolder(unpacked.home.Path(), platform::FileNameOf(archive));
  if (!platform::MakeFolders(unpacked.folder)) return Status::ErrorCreatingFile;
  const Status status = RunExtract(
      {.path = archive},
      {.folder = unpacked.folder, .extracted = [&files](const std::string&) { ++files; }}, job);
  job.filesChanged = false;
  return status;
}

void Finish(Shell& shell, const std::string& archive, const std::shared_ptr<Unpacked>& unpacked,
            bool pictures) {
  LogEvent("archive-folder", archive + (pictures ? "" : " pictureless"));
  if (!pictures && settings.EscalatePicturelessZips != 0) return ShowArchive(shell, archive);
  Kept()[archive] = unpacked;
  shell.Tabs().Show(unpacked->folder);
}

}  // namespace

void OpenArchiveFolder(Shell& shell, const std::string& archive) {
  const auto known = Kept().find(archive);
  // Systems clean up their temporary folders.
  if (known != Kept().end() && known->second->stamp == platform::StampOf(archive) &&
      platform::IsFolder(known->second->folder)) {
    shell.Tabs().Show(known->second->folder);
    return;
  }
  const auto unpacked = std::make_shared<Unpacked>();
  unpacked->stamp = platform::StampOf(archive);
  BatchJob job = NewBatchJob();
  job.noSummary = true;
  job.boxSettings.closeWhenDone = true;
  shell.Batches().Run(
      std::move(job), [&shell, archive, unpacked,
                       escalate = settings.EscalatePicturelessZips != 0](BatchJob& running) {
        const bool pictures = HasPictures(ReadArchiveListing(archive));
        size_t files = 0;
        Status status = Status::Ok;
        if (pictures || !escalate) status = Unpack(archive, *unpacked, files, running);
        if (running.stop.Token().Asked()) return status;
        shell.Window().CallAfter(
            [&shell, archive, unpacked, pictures, shown = files > 0 || (!pictures && escalate)] {
              if (!shown) return shell.Report(Tr("Nothing was unpacked."));
              Finish(shell, archive, unpacked, pictures);
            });
        return status;
      });
}

std::string ArchiveOfFolder(const std::string& folder) {
  for (const auto& [archive, unpacked] : Kept()) {
    const std::string& home = unpacked->home.Path();
    if (!home.empty() && folder.starts_with(home)) return archive;
  }
  return {};
}

const char* const kUnpackedFilesStay =
    TrLater("Files in an archive cannot be changed. Extract or copy them to a folder first.");

bool RefusesChange(wxWindow* parent, const std::vector<std::string>& paths) {
  const bool unpacked = std::ranges::any_of(
      paths, [](const std::string& path) { return !ArchiveOfFolder(path).empty(); });
  if (!unpacked) return false;
  LogEvent("prompt", "archive-stays");
  wxMessageBox(Label(kUnpackedFilesStay), Label("Archive"), wxOK | wxICON_INFORMATION, parent);
  return true;
}

bool MayOpenCopy(wxWindow* parent, const wxString& question) {
  if (settings.ArchivePromptExternal == 0) return true;
  wxRichMessageDialog dialog(parent, question, Label("Archive"), wxOK | wxCANCEL | wxICON_QUESTION);
  dialog.SetExtendedMessage(Label("This is a temporary copy. Changes to it will be lost."));
  dialog.SetOKCancelLabels(Label("&Open"), wxID_CANCEL);
  dialog.ShowCheckBox(Label("Do not ask again (can be re-enabled in Setup)"));
  LogEvent("prompt", "external");
  if (dialog.ShowModal() != wxID_OK) return false;
  if (dialog.IsCheckBoxChecked()) {
    settings.ArchivePromptExternal = 0;
    (void)SaveConfiguration();
  }
  return true;
}

std::string FolderForResults(const std::string& folder) {
  const std::string archive = ArchiveOfFolder(folder);
  return archive.empty() ? folder : platform::FolderOf(archive);
}

}  // namespace fotomill::desktop
