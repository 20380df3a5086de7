#pragma once

#include "metadata/exif/foreign_metadata.h"
#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/sequence.h"
#include "picture/write_options.h"
#include "plugins/fotomill_plugin.h"
#include "plugins/frame_file.h"

namespace fotomill {

// Operations of the spare row while it is bound to a plug-in format. Each looks up the module by
// file extension at call time, so that a picture can be converted from one plug-in format to
// another although both use the spare row. UnsupportedFunction (5) if no module handles the
// extension; a module's own error numbers are passed on. A module that crashes or takes too long is
// DamagedFile (2), in PluginWrite ErrorWritingFile (11).

// Reads header facts, metadata and comment. Metadata that cannot be read are left out. DamagedFile
// (2) if the module returns impossible sizes or depths.
Status PluginInfo(PictureRecord& picture, const ReadRequest& request);
// Decodes into `image`, and into `alpha` for 32-bit bitmaps. DamagedFile (2) if the returned bitmap
// does not match its header, MemoryAllocationError (6) if it cannot be locked or stored.
Status PluginRead(PictureRecord& picture, const ReadRequest& request);
// Has the module write a temporary file with the destination's name in a separate folder, and then
// moves its contents to the destination. ErrorWritingFile (11) if the module reports success
// without a file that it can read itself. A failed write leaves nothing behind. The comment is
// written if the options say so.
Status PluginWrite(PictureRecord& picture, const WriteOptions& options);

// As PluginWrite, for an animation; metadata and comment are those of `picture`, whose image is not
// used.
Status PluginWriteFrames(PictureRecord& picture, const FrameFacts& frames,
                         const WriteOptions& options);
// Starts an animation.
Status PluginSequenceBegin(const std::string& path, const SequenceFacts& facts,
                           const WriteOptions& options, SequencePointer& sequence);

// The EXIF block and XMP packet that a module finds in a file of one of its extensions. Called by
// several threads at a time.
bool PluginMetadata(const std::string& path, ForeignMetadata& metadata);

// Sets the configuration table that modules may access, in the ABI layout; not owned. Without this
// call modules get none.
void InstallPluginConfiguration(const FMW_CONFIG_ENTRY* rows, int32_t count);

// Binds the format of a file's extension to the registry's spare row and returns its index, or
// kNoFormat.
int32_t BindPluginFormat(std::string_view fileName);

}  // namespace fotomill
