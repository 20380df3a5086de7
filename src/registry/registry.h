#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "core/status.h"
#include "picture/picture_record.h"
#include "registry/format_table.h"

namespace fotomill {

// Row `index` of the registry; rows are static. Only `enabled`, `options` and the spare row
// change. The spare row is thread-local, so that files of different plug-in formats can be
// processed in parallel.
FormatEntry& FormatRow(int32_t index);
// The default of a row's `enabled` switch.
int32_t EnabledByDefault(int32_t index);

// The row for a file name's extension, or kNoFormat. The first row wins
// whose extension equals the name's or shares its first three characters,
// ignoring case; spare rows are skipped, as are disabled ones if plug-ins
// override them. If no row matches, plug-ins are searched.
int32_t FindFormatByName(std::string_view fileName, int32_t parameter = 0);
// The rows that read and write a file of that name: as FindFormatByName, but a row that shares only
// the name's first three characters and cannot do it here leaves it to a plug-in that has the whole
// extension. "x.avif" names the row of AVI.
int32_t FindReaderByName(std::string_view fileName);
int32_t FindWriterByName(std::string_view fileName);
// `AllowPluginFormatOverride`: plug-ins may handle
// the extensions of disabled rows. Off by default.
void LetPluginsOverrideFormats(bool on);

// Facts of a plug-in format. Without a plug-in source there are none.
struct PluginFormatFacts {
  std::string extension;  // uppercase, without the dot
  std::string textB;      // the module's description of its formats
  uint32_t maxBits = 0;   // maximum bits per pixel it can write
  bool canWrite = false;
};
// A library that a module uses.
struct PluginLibrary {
  std::string name, version;
};
// The plug-in loader's callbacks; installed once.
struct PluginSource {
  // Binds the plug-in format for a file's extension to this thread's spare row: index or kNoFormat.
  int32_t (*bind)(std::string_view fileName, int32_t parameter);
  // The formats of all modules, sorted.
  std::vector<PluginFormatFacts> (*list)();
  // The libraries of all modules.
  std::vector<PluginLibrary> (*libraries)();
};
void InstallPluginSource(const PluginSource* source);  // not owned; null removes it
// The plug-in fallback of FindFormatByName.
int32_t FindPluginFormat(std::string_view fileName, int32_t parameter = 0);
std::vector<PluginFormatFacts> PluginFormats();  // from the installed source; empty without one
std::vector<PluginLibrary> LibrariesOfPlugins();  // as above
// A plug-in format's name in lists: "(EXT) Plugin", followed by a blank and the module's text if it
// has one.
std::string PluginDescription(const PluginFormatFacts& format);

// Whether a row's format can be read and written on this machine.
bool CanRead(const FormatEntry& row);
bool CanWrite(const FormatEntry& row);  // false if a required library is missing
// Why a row cannot be read or written here, in one sentence; empty if both work.
std::string_view WhyNot(const FormatEntry& row);

// The settings and libraries of all codec families, in the order of
// formats/families.def, without duplicates.
std::vector<const FormatSettings*> SettingsOfFormats();
std::vector<FormatLibrary> LibrariesOfFormats();  // without duplicates

// Calls `startup`, or `shutdown`, of every row that has one, in row order.
void RunFormatStartup();
void RunFormatShutdown();  // after the last picture

// Opens and decodes a file into a new record: finds its row, runs `info` and, for rows that are not
// rendered, `read`. UnsupportedFormat (8) if no row matches, else the codec's status; `picture` is
// null unless Ok. If the row of the name rejects the file, it is opened with the row that matches
// its contents, if the request's IdentifyOptions allow it; the record's `formatIndex` is then that
// row. If that fails too, the status is that of the named row.
Status LoadPicture(const ReadRequest& request, PicturePointer& picture, void* window = nullptr);
// The first step of LoadPicture: a record with the header facts of a file. FileOpenError (1) for a
// path over 260 characters.
Status LoadPictureInfo(const ReadRequest& request, PicturePointer& picture);
// Whether a file was opened with a row other than that of its name.
bool OpenedByContents(const PictureRecord& picture);
// The second step: decodes a page of the file described by the record. NoImages (20) if the file
// has no such page, else the codec's status; `image` and `alpha` are empty unless Ok.
Status ReadPicture(const ReadRequest& request, PictureRecord& picture);

// Opens the frames of a file for sequential reading; a still picture of an animation format has one
// frame. UnsupportedFunction (5) for other formats, else the codec's status; `animation` is null
// unless Ok.
Status OpenAnimation(const ReadRequest& request, AnimationPointer& animation);

// Writes a picture to `destination` in the format of its extension. UnsupportedFormat (8) if no
// row matches, TooManyColors (12) if the picture is deeper than the row allows,
// UnsupportedFunction (5) if the row cannot write, EmptyImage (31) for a record without a picture,
// InvalidDestination (29) for a path over 260 characters, UnsuitableImage (13) if the format does
// not allow that size, else the codec's status. Alpha that the format cannot store is flattened
// first. The caller keeps the picture.
Status WritePicture(PictureRecord& picture, std::string_view destination,
                    const WriteOptions& options);
// As WritePicture, with a given row.
Status WritePictureAs(PictureRecord& picture, std::string_view destination, int32_t formatIndex,
                      const WriteOptions& options);

// The file type for a browser's column, such as
// "(BMP) Windows bitmap" or "(XYZ) XYZ file".
std::string DescribeFileType(std::string_view fileName);

// Description and patterns ("*.BMP;*.DIB") of one line of the open-file filter.
struct FilterPair {
  std::string description;
  std::string patterns;
};
// All pictures first, then one pair per readable
// row, in row order, then the plug-in formats.
std::vector<FilterPair> OpenFileFilter();
// Indices of the rows of the destination list, in row order. Some builds cannot write all of them.
std::vector<int32_t> DestinationRows();
// Those of them that this build writes, as lowercase extensions, followed by those of writable
// plug-in formats.
std::vector<std::string> DestinationExtensions();
// Indices of the rows in the format list, where the user switches formats on and off.
std::vector<int32_t> FormatListRows();
// Indices of the enabled rows, for other lists of formats, shown by their descriptions.
std::vector<int32_t> ChoiceRows();
// A line of the format list: a multiplication sign (U+00D7) or a blank, a tab, the description.
std::string FormatListLine(int32_t index);

}  // namespace fotomill
