#include "desktop/models/info/side_report.h"

#include <algorithm>
#include <string_view>
#include <utility>

#include "batch/picture_failure.h"
#include "core/choice_lists.h"
#include "core/utf8.h"
#include "desktop/models/browser/browser_model.h"
#include "desktop/models/view/photo_facts.h"
#include "metadata/tags/tag_lines.h"
#include "platform/paths.h"
#include "processing/geometry/scale.h"
#include "registry/registry.h"
#include "texts/grouped_count.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

std::string DimensionsLine(const PictureRecord& picture) {
  std::string line =
      Tr("%1 x %2 pixels, %3 bits", picture.width, picture.height, picture.bitsPerPixel);
  if ((picture.alphaFlags & kHasAlpha) != 0) line.append(", ").append(Tr("transparent"));
  if (picture.pageCount > 1) {
    line.append(", ").append(
        TrGroupedCount("%1 page", "%1 pages", static_cast<uint64_t>(picture.pageCount)));
  }
  return line;
}

constexpr size_t kLongestComment = 4000;  // bytes

// The beginning of the comment, without blanks after it.
std::string CommentOf(const PictureRecord& picture) {
  std::string_view text(reinterpret_cast<const char*>(picture.comment.data()),
                        picture.comment.size());
  text = text.substr(0, text.find('\0'));
  while (!text.empty() && static_cast<unsigned char>(text.back()) <= ' ') text.remove_suffix(1);
  if (text.size() <= kLongestComment) return std::string(text);
  return std::string(CutText(text, kLongestComment)) + "...";
}

Status MakePreview(PictureRecord& picture, const SideOptions& options, SideReport& report) {
  RETURN_IF_BAD(PrepareForDisplay(picture, options.matte));
  report.histogram = HistogramOf(picture.image);
  const int32_t side = options.side;
  if (picture.image.Width() <= side && picture.image.Height() <= side)
    return ToRgb(picture.image, report.preview);
  PackedImage scaled, noAlpha, noScaledAlpha;
  RETURN_IF_BAD(ScaleFiltered(picture.image, noAlpha,
                              FitSize(picture.image.Width(), picture.image.Height(), side),
                              ScaleFilter::Bicubic, scaled, noScaledAlpha));
  return ToRgb(scaled, report.preview);
}

Status ReadPictureReport(const SideOptions& options, const StopToken& stop, SideReport& report) {
  const ReadRequest request{.fileName = report.path,
                            .thumbnailSide = options.side,
                            .partial = true,
                            .stop = stop,
                            .options = options.read};
  PicturePointer picture;
  RETURN_IF_BAD(LoadPictureInfo(request, picture));
  report.remark = MisnamedRemark(*picture);
  report.facts.insert(report.facts.begin() + 1, DimensionsLine(*picture));
  const Status status = ReadPicture(request, *picture);
  report.comment = CommentOf(*picture);
  report.photo = PhotoFacts(picture->metadata.exif);
  RETURN_IF_BAD(status);
  if (picture->shortfall != Status::Ok)
    report.remark = Tr("The file is damaged or incomplete; part of the picture is missing.");
  return MakePreview(*picture, options, report);
}

void AddTags(const SideOptions& options, SideReport& report) {
  PictureTags tags;
  if (ReadPictureTags(report.path, options.tags, tags) != Status::Ok) return;
  report.rating = std::exchange(tags.rating, 0);
  const std::string comment = std::exchange(tags.comment, {});
  if (!comment.empty()) report.comment = comment;
  for (const TagLine& line : TagLines(tags))
    report.tags.push_back(std::string(Tr(line.label)) + ": " + line.text);
}

void CountFolder(const StopToken& stop, SideReport& report) {
  const FolderListing listing = ListForBrowser(report.path, false, stop);
  if (listing.state != FolderState::Listed) {
    report.remark = Tr("This folder cannot be read.");
    return;
  }
  const auto folders = static_cast<uint64_t>(
      std::ranges::count_if(listing.items, [](const FolderItem& item) { return item.folder; }));
  const uint64_t files = listing.items.size() - folders;
  std::string line = TrGroupedCount("%1 file", "%1 files", files);
  if (folders > 0) line.append(", ").append(TrGroupedCount("%1 folder", "%1 folders", folders));
  report.facts.push_back(std::move(line));
}

}  // namespace

std::string SideReport::RatingText() const {
  constexpr int32_t kStars = 5;
  if (rating < 0) return Tr("rejected");
  std::string stars;
  for (int32_t star = 1; star <= kStars && rating > 0; ++star)
    stars += star <= rating ? "\u2605" : "\u2606";
  return stars;
}

std::string SideReport::Text() const {
  std::string text = name;
  const auto add = [&text](const std::string& line) {
    if (!line.empty()) text.append("\n").append(line);
  };
  add(remark);
  for (const std::string& line : facts) add(line);
  add(RatingText());
  add(comment);
  for (const std::string& line : tags) add(line);
  for (const std::string& line : photo) add(line);
  return text;
}

SideReport ReadSideReport(const std::string& folder, const FolderItem& item,
                          const SideOptions& options, const StopToken& stop) {
  SideReport report;
  report.path = platform::JoinFolder(folder, item.name);
  report.name = item.name;
  if (item.folder) {
    CountFolder(stop, report);
    if (item.modified != 0) report.facts.push_back(DateText(item.modified));
    return report;
  }
  report.facts.push_back(DescribeFileType(item.name));
  report.facts.push_back(SizeText(item.size, choice::kSizeFitting) + ", " +
                         DateText(item.modified));
  const Status status = ReadPictureReport(options, stop, report);
  if (!stop.Asked()) AddTags(options, report);
  if (status != Status::Ok) {
    report.remark = FailureText(report.path, status);
    report.preview = {};
  }
  return report;
}

}  // namespace fotomill::desktop
