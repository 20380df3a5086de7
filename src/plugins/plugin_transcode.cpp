#include "plugins/plugin_transcode.h"

#include <algorithm>

#include "core/byte_writer.h"
#include "picture/write_options.h"
#include "platform/file_view.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/temporary_folder.h"
#include "plugins/module_apart.h"
#include "plugins/module_call.h"
#include "plugins/plugin_table.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

// The module that can store `source` as `destination`, null if there is none. One of both is of its
// own format.
const PluginFormat* TranscoderOf(const std::string& source, const std::string& destination) {
  for (const std::string& name : {destination, source}) {
    (void)FindPluginFormat(name);  // loads the modules
    const PluginFormat* const format = PluginFormatOf(name);
    if (format != nullptr && format->facts->transcodes) return format;
  }
  return nullptr;
}

Status Transcode(const PluginFormat& format, const std::string& source,
                 const std::string& destination) {
  const std::string module(format.entry.path.view());
  if (format.here == nullptr) return TranscodeApart(module, source, destination, {});
  const ModuleCall call(module, ModuleStage::Working);
  return TranscodeHere(*format.here, source, destination, {});
}

// Whether what was stored gives the source again. A file of the module's own format is not stored
// but restored.
Status CheckReturn(const PluginFormat& format, const std::string& source, const std::string& stored,
                   const platform::TemporaryFolder& folder) {
  if (PluginFormatOf(source) == &format) return Status::Ok;
  const std::string again = platform::JoinFolder(
      folder.Path(), std::string("again").append(platform::SplitPath(source).extension));
  RETURN_IF_BAD(Transcode(format, stored, again));
  platform::FileView first, second;
  if (!first.Open(source) || !second.Open(again)) return Status::FileReadError;
  return std::ranges::equal(first.Bytes(), second.Bytes()) ? Status::Ok : Status::UnsupportedFormat;
}

}  // namespace

Status TranscodePicture(const std::string& source, const std::string& destination,
                        platform::Existing existing) {
  const PluginFormat* const format = TranscoderOf(source, destination);
  if (format == nullptr) return Status::UnsupportedFunction;
  if (!platform::IsRegularFile(source)) return Status::FileOpenError;
  ByteWriter out;
  platform::TemporaryFolder folder;
  if (!out.Create(destination) || !folder.Create()) return Status::ErrorCreatingFile;
  const std::string stored = platform::JoinFolder(
      folder.Path(), std::string("stored").append(platform::SplitPath(destination).extension));
  RETURN_IF_BAD(Transcode(*format, source, stored));
  RETURN_IF_BAD(CheckReturn(*format, source, stored, folder));
  platform::FileView written;
  if (!written.Open(stored) || written.Bytes().empty()) return Status::ErrorWritingFile;
  out.Bytes(written.Bytes());
  return written.Intact() ? CommitStatus(out.Commit(existing)) : Status::ErrorWritingFile;
}

}  // namespace fotomill
