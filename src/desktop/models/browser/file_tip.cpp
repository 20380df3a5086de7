#include "desktop/models/browser/file_tip.h"

#include <algorithm>
#include <string_view>
#include <utility>

#include "core/choice_lists.h"
#include "core/utf8.h"
#include "desktop/models/browser/browser_model.h"
#include "platform/paths.h"
#include "registry/registry.h"
#include "settings/job_options.h"
#include "texts/status_text.h"
#include "texts/grouped_count.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr size_t kLongestComment = 300;  // bytes

// The beginning of a text, not cut inside a character.
std::string Beginning(std::string_view text) {
  text = text.substr(0, text.find('\0'));
  while (!text.empty() && static_cast<unsigned char>(text.back()) <= ' ') text.remove_suffix(1);
  if (text.size() <= kLongestComment) return std::string(text);
  return std::string(CutText(text, kLongestComment)) + "...";
}

// Adds the lines that need the file's header.
void AddHeaderLines(const std::string& path, Status known, std::vector<std::string>& lines) {
  PicturePointer picture;
  const Status status =
      LoadPictureInfo({.fileName = path, .options = ReadOptionsFromSettings()}, picture);
  const Status problem = status != Status::Ok ? status : known;
  if (problem != Status::Ok) lines.push_back(StatusText(problem));
  if (status != Status::Ok) return;
  std::string facts =
      Tr("%1 x %2 pixels, %3 bits", picture->width, picture->height, picture->bitsPerPixel);
  if (picture->pageCount > 1) {
    facts.append(", ").append(
        TrGroupedCount("%1 page", "%1 pages", static_cast<uint64_t>(picture->pageCount)));
  }
  lines.push_back(std::move(facts));
  std::string comment =
      Beginning({reinterpret_cast<const char*>(picture->comment.data()), picture->comment.size()});
  if (!comment.empty()) lines.push_back(std::move(comment));
}

}  // namespace

std::vector<std::string> FileTipLines(const std::string& folder, const FolderItem& item,
                                      Status known) {
  std::vector<std::string> lines{item.name};
  if (item.folder) {
    if (item.modified != 0) lines.push_back(DateText(item.modified));
    return lines;
  }
  lines.push_back(DescribeFileType(item.name));
  lines.push_back(SizeText(item.size, choice::kSizeFitting) + ", " + DateText(item.modified));
  AddHeaderLines(platform::JoinFolder(folder, item.name), known, lines);
  return lines;
}

}  // namespace fotomill::desktop
