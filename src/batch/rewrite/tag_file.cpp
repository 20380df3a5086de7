#include "batch/rewrite/tag_file.h"

#include <utility>

#include "metadata/tags/sidecar.h"
#include "platform/existence.h"
#include "platform/file_view.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

class TagRewrite {
 public:
  TagRewrite(const std::string& source, const std::string& destination, const TagRequest& tags,
             const RewriteRequest& request, const WriteOptions& options)
      : source_(source),
        destination_(destination),
        tags_(tags),
        request_(request),
        options_(options) {}

  RewrittenFile Run() {
    result_.status = Steps();
    return std::move(result_);
  }

 private:
  bool InPlace() const { return source_ == destination_; }

  Status Steps() {
    RETURN_IF_BAD(ReadCurrent());
    const std::string old = FindSidecar(source_);
    RETURN_IF_BAD(CheckSidecar(old));
    bool toSidecar = tags_.sidecarOnly;
    if (!tags_.sidecarOnly) RETURN_IF_BAD(RewritePicture(toSidecar));
    if (toSidecar || !old.empty()) RETURN_IF_BAD(WriteSidecar(old, toSidecar));
    return tags_.commentFiles && tags_.changes.description ? WriteComment() : Status::Ok;
  }

  Status ReadCurrent() {
    const Status status = ReadPictureTags(source_, {}, current_);
    return status == Status::Ok ? status : Fail(status, ReasonSentence());
  }
  Status Fail(Status status, std::string hint) {
    result_.hint = std::move(hint);
    return status;
  }

  // Before the picture is changed: whether its sidecar can be changed, too.
  Status CheckSidecar(const std::string& old) {
    if (old.empty()) return Status::Ok;
    const std::string name(platform::FileNameOf(old));
    if (InPlace() && platform::FactsOf(old).link)
      return Fail(Status::ErrorCreatingFile, Tr("Its sidecar %1 is a link.", name));
    platform::FileView file;
    if (!file.Open(old)) return Fail(Status::FileOpenError, ReasonSentence());
    std::vector<uint8_t> made;
    bool changed = false;
    const Status status = EditSidecar(file.Bytes(), current_, tags_.changes, made, changed);
    return status == Status::DamagedFile
               ? Fail(status, Tr("Its sidecar %1 cannot be changed safely.", name))
               : status;
  }

  // What cannot be changed safely goes to a sidecar.
  static bool IsUnsafe(Status status) {
    return status == Status::UnsupportedFormat || status == Status::UnsuitableImage ||
           status == Status::DamagedFile || status == Status::FileReadError;
  }

  Status RewritePicture(bool& toSidecar) {
    FileRewrite rewrite(source_, destination_, request_, options_);
    FilePieces made;
    platform::FileView file;
    const FileMaker maker = [&](std::span<const uint8_t> bytes, FilePieces& pieces, bool& changed,
                                std::string& reason) {
      const Status status = EditPictureTags(bytes, tags_.changes, pieces, changed, reason);
      toSidecar = IsUnsafe(status);
      if (!toSidecar) return status;
      reason_ = reason;
      changed = false;
      return Status::Ok;
    };
    Status status = rewrite.Begin();
    if (status == Status::Ok) status = rewrite.Make(maker, made, file);
    Take(rewrite);
    return status;
  }

  void Take(FileRewrite& rewrite) {
    result_.changed = result_.changed || rewrite.result.changed;
    if (!rewrite.result.hint.empty()) result_.hint = std::move(rewrite.result.hint);
  }

  // `needed`: the sidecar is the place of the tags, not only a copy.
  Status WriteSidecar(const std::string& old, bool needed) {
    const std::string path = InPlace() && !old.empty() ? old : SidecarNames(destination_).front();
    const auto edit = [&](std::span<const uint8_t> bytes, std::vector<uint8_t>& made,
                          bool& changed) {
      return EditSidecar(bytes, current_, tags_.changes, made, changed);
    };
    bool written = false;
    RETURN_IF_BAD(WriteBeside(old, path, edit, written));
    if (!needed || !written) return Status::Ok;
    const std::string name(platform::FileNameOf(path));
    result_.note = TrRecorded("Written to %1.", name);
    if (!reason_.empty()) result_.note.shown = reason_ + " " + result_.note.shown;
    return Status::Ok;
  }

  Status WriteComment() {
    const std::string path =
        CommentFileName(destination_, tags_.sources.commentFolder, tags_.sources.commentExtension);
    const std::string folder = platform::FolderOf(path);
    const bool there = platform::ExistenceOf(path) == platform::Existence::Yes;
    const std::string text =
        *tags_.changes.description + (tags_.changes.description->empty() ? "" : "\n");
    if (!there && text.empty()) return Status::Ok;
    if (!request_.dryRun && !folder.empty() && !platform::MakeFolders(folder))
      return Fail(Status::ErrorCreatingFile, ReasonSentence());
    const auto edit = [&](std::span<const uint8_t> bytes, std::vector<uint8_t>& made,
                          bool& changed) {
      made.assign(text.begin(), text.end());
      changed = !std::ranges::equal(made, bytes);
      return Status::Ok;
    };
    bool written = false;
    return WriteBeside(there ? path : std::string(), path, edit, written);
  }

  // Writes a file beside the picture, made from an old one unless that name is empty. Only that one
  // is replaced.
  template <typename Edit>
  Status WriteBeside(const std::string& old, const std::string& path, const Edit& edit,
                     bool& written) {
    RewriteRequest request = request_;
    request.keepTime = false;
    WriteOptions options;
    options.existing = old == path ? platform::Existing::Replace : platform::Existing::Refuse;
    if (request_.keepPrevious) options.makeWay = [&] { return request_.keepPrevious(path); };
    FileRewrite rewrite(path, path, request, options);
    const Status status = [&] {
      RETURN_IF_BAD(rewrite.Begin());
      platform::FileView file;
      if (!old.empty() && !file.Open(old))
        return rewrite.Fail(Status::FileOpenError, ReasonSentence());
      std::vector<uint8_t> made;
      RETURN_IF_BAD(edit(file.Bytes(), made, written));
      const bool copies = !written && !old.empty() && old != path;
      if (!written && !copies) return Status::Ok;
      const std::span<const uint8_t> whole = copies ? file.Bytes() : made;
      return rewrite.Write({&whole, 1}, false);
    }();
    Take(rewrite);
    if (rewrite.result.changed && !request_.dryRun && request_.replaced) request_.replaced(path);
    return status;
  }

  const std::string &source_, &destination_;
  const TagRequest& tags_;
  const RewriteRequest& request_;
  const WriteOptions& options_;
  PictureTags current_;  // before the change
  std::string reason_;   // why the picture itself is not changed
  RewrittenFile result_;
};

}  // namespace

RewrittenFile TagPictureFile(const std::string& source, const std::string& destination,
                             const TagRequest& tags, const RewriteRequest& request,
                             const WriteOptions& options) {
  return TagRewrite(source, destination, tags, request, options).Run();
}

}  // namespace fotomill
