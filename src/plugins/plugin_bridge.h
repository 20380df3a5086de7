#pragma once

#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/write_options.h"
#include "plugins/fotomill_plugin.h"

namespace fotomill {

// The operations of a format row that is bound to a plug-in format. Each finds the module by the
// file's extension at the time of the call, so that a picture can go from one plug-in format to
// another although both use the spare row. All answer UnsupportedFunction (5) when no module serves
// the extension; a module's own error numbers are passed on.

// Fills the facts and the comment. A comment that cannot be had is left out. DamagedFile (2) when
// the module claims sizes or depths that no picture has.
Status PluginInfo(PictureRecord& picture, const ReadRequest& request);
// Decodes into `image`, and `alpha` for 32-bit bitmaps. DamagedFile (2) when the returned bitmap is
// not what its header claims, MemoryAllocationError (6) when it cannot be locked or held.
Status PluginRead(PictureRecord& picture, const ReadRequest& request);
// Lets the module write a working file of the destination's name in a folder of its own, whose
// contents then become the destination. ErrorWritingFile (11) when the module reports success
// without a file that it can read itself. Nothing is left of a failed write. The comment goes along
// where the options say so.
Status PluginWrite(PictureRecord& picture, const WriteOptions& options);

// Reads the comment inside a file into `picture.comment`. MemoryAllocationError (6) when the
// returned text cannot be locked; Ok without a comment when the module has none to give.
Status PluginComment(PictureRecord& picture, const char* fileName);

// The configuration keys that modules may read and change, in the layout that they see; not owned.
// Without this call modules get none.
void InstallPluginConfiguration(const FMW_CONFIG_ENTRY* rows, int32_t count);

// Binds the format of a file's extension to the registry's spare row and returns its index, or
// kNoFormat.
int32_t BindPluginFormat(std::string_view fileName);

}  // namespace fotomill
