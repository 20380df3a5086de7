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

// Row `index` of the registry; the rows live as long as the program. Only `enabled`, `options` and
// the spare row change. Every thread has a spare row of its own, so that files of different plug-in
// formats can be in work at once.
FormatEntry& FormatRow(int32_t index);
// The built-in state of a row's switch `enabled`.
int32_t EnabledByDefault(int32_t index);

// The row that a file name selects by its extension, or kNoFormat. The first row wins whose
// extension equals the name's, or whose first three characters equal the first three of the name's,
// ignoring case; spare rows are skipped, as are disabled ones where plug-ins override them. Where
// no row matches, the plug-ins are asked.
int32_t FindFormatByName(std::string_view fileName, int32_t parameter = 0);
// `AllowPluginFormatOverride`: rows that are switched off leave their extensions to the plug-ins.
// At first they do not.
void LetPluginsOverrideFormats(bool on);

// What the registry asks the plug-in loader for. Without one no plug-in format exists.
struct PluginFormatFacts {
  std::string extension;  // upper case, without the dot
  std::string textB;      // the module's description of its formats
  uint32_t maxBits = 0;   // deepest picture that it writes
  bool canWrite = false;
};
// The loader's answers; installed once.
struct PluginSource {
  // Binds the format of a file's extension to this thread's spare row; its index, or kNoFormat.
  int32_t (*bind)(std::string_view fileName, int32_t parameter);
  // The formats of all modules, sorted.
  std::vector<PluginFormatFacts> (*list)();
};
void InstallPluginSource(const PluginSource* source);  // not owned; null removes it
// The plug-in fallback of FindFormatByName.
int32_t FindPluginFormat(std::string_view fileName, int32_t parameter = 0);
std::vector<PluginFormatFacts> PluginFormats();  // of the installed source; empty without one
// How lists show a plug-in format: "(EXT) Plugin", followed by a blank and the module's text when
// it has one.
std::string PluginDescription(const PluginFormatFacts& format);

// Whether pictures of a row can be read and written on this machine.
bool CanRead(const FormatEntry& row);
bool CanWrite(const FormatEntry& row);  // a library that is missing here counts
// Why a row cannot be read or cannot be written here, in one sentence; empty when both work.
std::string_view WhyNot(const FormatEntry& row);

// What the codecs of all families have to be set and are built with, in the order of
// formats/families.def, each once.
std::vector<const FormatSettings*> SettingsOfFormats();
std::vector<FormatLibrary> LibrariesOfFormats();  // each once

// Call `startup`, or `shutdown`, of every row that has one, in row order.
void RunFormatStartup();
void RunFormatShutdown();  // after the last picture

// Opens and decodes what is asked for into a new record: finds its row, runs `info` and, for rows
// that are not rendered, `read`. UnsupportedFormat (8) when no row matches, else the codec's own
// status; `picture` is null unless Ok. A file that the row of its name refuses is opened by the row
// that its contents fit, as far as the request's IdentifyOptions let it; the record's `formatIndex`
// is that row then. Where this fails too, the status is that of the row of the name.
Status LoadPicture(const ReadRequest& request, PicturePointer& picture, void* window = nullptr);
// The first half of it: a record with the facts of a file. FileOpenError (1) for a path over 260
// characters.
Status LoadPictureInfo(const ReadRequest& request, PicturePointer& picture);
// Whether the record of a file has facts that a row of another format than its name's gave.
bool OpenedByContents(const PictureRecord& picture);
// The second half: decodes a page of the file that the record has the facts of. NoImages (20) when
// the file has no such page, else the codec's own status; `image` and `alpha` are empty unless Ok.
Status ReadPicture(const ReadRequest& request, PictureRecord& picture);

// Opens the frames of a file, to be gone through in order; a still picture of such a format has
// one. UnsupportedFunction (5) for formats without, else the codec's own status; `animation` is
// null unless Ok.
Status OpenAnimation(const ReadRequest& request, AnimationPointer& animation);

// Writes a picture to `destination` in the format of its extension. UnsupportedFormat (8) when no
// row matches, TooManyColors (12) when the picture is deeper than the row takes,
// UnsupportedFunction (5) when the row cannot write, EmptyImage (31) for a record without a
// picture, InvalidDestination (29) for a path over 260 characters, UnsuitableImage (13) when the
// row's files cannot be that large or that small, else the codec's own status.
// Alpha that the format cannot hold is flattened first. The picture stays the caller's.
Status WritePicture(PictureRecord& picture, std::string_view destination,
                    const WriteOptions& options);
// The same to a given row.
Status WritePictureAs(PictureRecord& picture, std::string_view destination, int32_t formatIndex,
                      const WriteOptions& options);

// The type name of a file for a browser's column, such as "(BMP) Windows bitmap", or "(XYZ) XYZ
// file".
std::string DescribeFileType(std::string_view fileName);

// Description and patterns ("*.BMP;*.DIB") of one line of the open-file filter.
struct FilterPair {
  std::string description;
  std::string patterns;
};
// All pictures first, then one pair per row that can be opened, in row order, then the plug-in
// formats.
std::vector<FilterPair> OpenFileFilter();
// Rows in which pictures can be saved, as offered to the user, in row order: indices.
std::vector<int32_t> DestinationRows();
// The same as the user sees them: extensions in lower case, followed by those of plug-in formats
// that can be written.
std::vector<std::string> DestinationExtensions();
// The rows of the format list, in which the user switches formats on and off: indices.
std::vector<int32_t> FormatListRows();
// The rows of other lists to choose a format from, shown by their descriptions: those switched on.
std::vector<int32_t> ChoiceRows();
// A line of the format list: a multiplication sign (U+00D7) or a blank, a tab, the description.
std::string FormatListLine(int32_t index);

}  // namespace fotomill
