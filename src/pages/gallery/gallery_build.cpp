#include "pages/gallery/gallery_build.h"

#include <algorithm>
#include <memory>
#include <optional>
#include <set>

#include "batch/picture_failure.h"
#include "core/md5.h"
#include "core/text.h"
#include "core/workers/folder_scope.h"
#include "core/workers/ordered_run.h"
#include "operations/macros.h"
#include "pages/gallery/exposure_text.h"
#include "picture/write_options.h"
#include "platform/existence.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "processing/color/color_transform.h"
#include "processing/geometry/scale.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

constexpr const char* kPictureFolder = "pictures";
// The pictures of the previous build, one name a line, to delete those no longer used.
constexpr const char* kListName = "gallery-files.txt";
constexpr const char *kStyleName = "gallery.css", *kScriptName = "gallery.js";
constexpr uint64_t kMostBytes = uint64_t{64} << 20;  // of a page or the list
// WebP takes ten times as long as JPEG, so it is left to the pictures that every visitor loads.
constexpr int32_t kMostWebp = 1000;  // longer side
constexpr size_t kMostSlug = 40, kDigest = 12;
constexpr const char* kVersion = " 1";  // of the pictures: changes when they are made differently

// A name for URLs: small letters and digits of the file's name, and a digest of what its pictures
// depend on.
std::string SlugOf(const std::string& file, const GalleryOptions& options) {
  const platform::FileFacts facts = platform::FactsOf(file);
  const auto time = platform::ModificationTime(file).value_or(platform::ExactTime{});
  std::string key = platform::AbsolutePath(file);
  for (const int64_t number : {static_cast<int64_t>(facts.size), time.seconds, time.nanoseconds,
                               int64_t{options.quality}, int64_t{options.reading.upright}}) {
    key.append(1, ' ').append(std::to_string(number));
  }
  key.append(kVersion);
  for (const int32_t side : options.sides) key.append(1, ' ').append(std::to_string(side));
  std::string slug;
  for (const char c : LowerCase(platform::SplitPath(file).base)) {
    const bool plain = IsLetter(c) || (c >= '0' && c <= '9');
    if (!plain && (slug.empty() || slug.back() == '-')) continue;
    if (slug.size() == kMostSlug) break;
    slug += plain ? c : '-';
  }
  if (!slug.empty() && slug.back() != '-') slug += '-';
  // an id begins with a letter
  if (slug.empty() || !IsLetter(slug[0])) slug = std::string("p-") + slug;
  const auto* const bytes = reinterpret_cast<const uint8_t*>(key.data());
  return slug + Md5Text({bytes, key.size()}).substr(0, kDigest);
}

// The sizes of a picture: not larger than itself, without two that are alike.
std::vector<Size> SizesOf(const PagePicture& facts, const std::vector<int32_t>& sides) {
  std::vector<Size> sizes;
  const int32_t full = std::max(facts.width, facts.height);
  for (const int32_t side : sides) {
    if (side < full) sizes.push_back(FitSize(facts.width, facts.height, side));
  }
  if (sizes.size() < sides.size()) sizes.push_back({facts.width, facts.height});
  return sizes;
}

// Path from a folder to a file, both absolute.
std::string RelativePath(const std::string& folder, const std::string& file) {
  size_t common = 0;
  for (size_t i = 0; i <= folder.size() && i < file.size(); ++i) {
    const char c = i < folder.size() ? folder[i] : '/';
    if (c != file[i]) break;
    if (c == '/') common = i + 1;
  }
  std::string path;
  for (size_t i = common; i <= folder.size() && common <= folder.size(); ++i) {
    if (i == folder.size() || folder[i] == '/') path += "../";
  }
  return path + file.substr(common);
}

// The lines of a list of files.
std::set<std::string> LinesOf(const std::string& text) {
  std::set<std::string> lines;
  for (size_t start = 0; start < text.size();) {
    const size_t end = std::min(text.find('\n', start), text.size());
    lines.insert(text.substr(start, end - start));
    start = end + 1;
  }
  return lines;
}

std::string ListPath(const std::string& folder) {
  return platform::JoinFolder(platform::JoinFolder(folder, kPictureFolder), kListName);
}

// The files of the previous build; nullopt if there was none.
std::optional<std::set<std::string>> PreviousFiles(const std::string& folder) {
  std::string text;
  if (platform::ReadWholeFile(ListPath(folder), kMostBytes, text) != platform::ReadResult::Done)
    return std::nullopt;
  return LinesOf(text);
}

class GalleryBuild {
 public:
  GalleryBuild(std::span<const BatchFile> files, const GalleryOptions& options,
               const GalleryHost& host, std::vector<GalleryOutcome>& outcomes)
      : files_(files),
        options_(options),
        host_(host),
        outcomes_(outcomes),
        pictures_(files.size()),
        pictureFolder_(platform::JoinFolder(options.folder, kPictureFolder)),
        jpeg_(FindFormatByName("x.jpg")),
        webp_(FindFormatByName("x.webp")) {
    outcomes_.assign(files.size(), {});
  }

  Status Run(std::string& failed) {
    if (!options_.dryRun && !platform::MakeFolders(pictureFolder_)) {
      failed = pictureFolder_;
      return Status::ErrorCreatingFile;
    }
    OrderedRun run({.work = [this](size_t i) { return Work(i); },
                    .deliver = [this](size_t i, Status status) { Deliver(i, status); },
                    .goesOn = [this] { return GoesOn(); },
                    .tick =
                        [this] {
                          if (host_.tick) host_.tick();
                        }});
    run.Run(files_.size(), options_.jobs == 0 ? platform::CoreCount() : options_.jobs);
    if (!GoesOn()) return Status::FunctionCancelled;
    return options_.dryRun ? Status::Ok : WriteAll(failed);
  }

 private:
  bool GoesOn() const { return !host_.goesOn || host_.goesOn(); }
  bool UsesWebp() const {
    return options_.webp && webp_ != kNoFormat && CanWrite(FormatRow(webp_));
  }

  Status Work(size_t i) {
    if (files_[i].status != Status::Ok) return files_[i].status;
    const std::string& file = files_[i].name;
    const FolderScope folder(file);
    PagePicture facts;
    PicturePointer record;
    RETURN_IF_BAD(ReadPageFacts(file, options_.reading, facts, record));
    GalleryPicture& picture = pictures_[i];
    picture.id = SlugOf(file, options_);
    const MacroFacts macros{.fileName = file,
                            .copyrightHolder = options_.copyrightHolder,
                            .modified = platform::FactsOf(file).modified};
    picture.caption = ExpandMacros(options_.caption, macros, *record);
    if (options_.details) picture.details = ExposureText(record->metadata.exif);
    if (options_.originals) {
      picture.original = UrlPath(
          RelativePath(platform::AbsolutePath(options_.folder), platform::AbsolutePath(file)));
    }
    bool kept = true;
    for (const Size& size : SizesOf(facts, options_.sides)) {
      GallerySize& entry = picture.sizes.emplace_back();
      entry.width = size.width;
      entry.height = size.height;
      const std::string base = std::string(kPictureFolder) + "/" + picture.id + "-" +
                               std::to_string(std::max(size.width, size.height));
      entry.jpeg = base + ".jpg";
      if (UsesWebp() && std::max(size.width, size.height) <= kMostWebp) entry.webp = base + ".webp";
      kept = kept && IsThere(entry.jpeg) && (entry.webp.empty() || IsThere(entry.webp));
    }
    outcomes_[i].destination = PathOf(picture.sizes.back().jpeg);
    outcomes_[i].kept = kept;
    return kept || options_.dryRun ? Status::Ok : WritePictures(picture, *record);
  }

  std::string PathOf(const std::string& url) const {
    return platform::JoinFolder(options_.folder, url);
  }
  bool IsThere(const std::string& url) const { return platform::IsRegularFile(PathOf(url)); }

  // The largest first, each made from the one before.
  Status WritePictures(const GalleryPicture& picture, PictureRecord& record) const {
    const GallerySize& largest = picture.sizes.back();
    RETURN_IF_BAD(ReadPagePicture(options_.reading, largest.width, largest.height, record));
    const ColorTransform transform(record.metadata.icc);
    if (transform.ChangesColors())
      RETURN_IF_BAD(transform.Apply(record.image, options_.reading.stop));
    // nothing but pixels is published: no position, no serial numbers
    record.metadata = {};
    record.comment.clear();
    for (size_t i = picture.sizes.size(); i-- > 0;) {
      const GallerySize& size = picture.sizes[i];
      if (size.width != record.image.Width() || size.height != record.image.Height())
        RETURN_IF_BAD(ScalePicture(record, {size.width, size.height}, ScaleFilter::Lanczos));
      WriteOptions write;
      write.encode.jpegQuality = write.encode.webpQuality = options_.quality;
      write.encode.jpegProgressive = true;
      write.keepMetadata = false;
      if (!size.webp.empty())
        RETURN_IF_BAD(WritePictureAs(record, PathOf(size.webp), webp_, write));
      RETURN_IF_BAD(WritePictureAs(record, PathOf(size.jpeg), jpeg_, write));
    }
    return Status::Ok;
  }

  void Deliver(size_t i, Status status) {
    outcomes_[i].status = status;
    if (status != Status::Ok) {
      outcomes_[i].hint =
          files_[i].status != Status::Ok ? files_[i].hint : OpenHint(files_[i].name, status);
      outcomes_[i].destination.clear();
    }
    if (host_.progress) host_.progress(i + 1, files_.size());
  }

  Status WriteAll(std::string& failed) {
    std::vector<GalleryPicture> shown;
    std::string list;
    for (size_t i = 0; i < files_.size(); ++i) {
      if (outcomes_[i].status != Status::Ok) continue;
      for (const GallerySize& size : pictures_[i].sizes) {
        list += size.jpeg + "\n";
        if (!size.webp.empty()) list += size.webp + "\n";
      }
      shown.push_back(std::move(pictures_[i]));
    }
    // a mistyped name must not empty a gallery
    if (shown.empty()) return Status::Ok;
    const size_t perPage = std::max<size_t>(options_.perPage, 1);
    const size_t pages = std::max<size_t>((shown.size() + perPage - 1) / perPage, 1);
    GalleryTexts texts = options_.texts;
    if (host_.countText) texts.count = host_.countText(shown.size());
    for (size_t page = 0; page < pages; ++page) list += GalleryPageName(page) + "\n";
    // before the pages, so that after an interruption the next build knows them as its own
    const std::set<std::string> previous =
        PreviousFiles(options_.folder).value_or(std::set<std::string>());
    const std::string listName = std::string(kPictureFolder) + "/" + kListName;
    RETURN_IF_BAD(Update(listName, list + MissingIn(list, previous), failed));
    for (size_t page = 0; page < pages; ++page) {
      const auto part = std::span(shown).subspan(page * perPage,
                                                 std::min(perPage, shown.size() - page * perPage));
      RETURN_IF_BAD(Update(GalleryPageName(page),
                           GalleryPage(options_.theme, texts, part, page, pages), failed));
    }
    RETURN_IF_BAD(Update(kStyleName, options_.theme.style, failed));
    RETURN_IF_BAD(Update(kScriptName, options_.theme.script, failed));
    DeleteUnused(previous, list);
    return Update(listName, list, failed);
  }

  // The lines that a list lacks.
  static std::string MissingIn(const std::string& list, const std::set<std::string>& lines) {
    const std::set<std::string> present = LinesOf(list);
    std::string missing;
    for (const std::string& line : lines) {
      if (!present.contains(line)) missing += line + "\n";
    }
    return missing;
  }

  // Writes a file unless it has these contents already.
  Status Update(const std::string& name, const std::string& contents, std::string& failed) const {
    const std::string path = PathOf(name);
    std::string present;
    if (platform::ReadWholeFile(path, kMostBytes, present) == platform::ReadResult::Done &&
        present == contents)
      return Status::Ok;
    if (platform::WriteWholeFile(path, contents)) return Status::Ok;
    failed = path;
    return Status::ErrorWritingFile;
  }

  // Deletes files of the previous build; only names like those of this program.
  void DeleteUnused(const std::set<std::string>& previous, const std::string& list) const {
    const std::set<std::string> used = LinesOf(list);
    for (const std::string& name : previous) {
      if (!used.contains(name) && IsOwnName(name)) (void)platform::DeleteFile(PathOf(name));
    }
  }

  static bool IsOwnName(const std::string& name) {
    const std::string prefix = std::string(kPictureFolder) + "/";
    const bool picture =
        name.starts_with(prefix) && (name.ends_with(".jpg") || name.ends_with(".webp"));
    const bool page = name.starts_with("page-") && name.ends_with(".html");
    const std::string_view rest = picture ? std::string_view(name).substr(prefix.size()) : name;
    return (picture || page) &&
           rest.find_first_not_of("abcdefghijklmnopqrstuvwxyz0123456789-.") ==
               std::string_view::npos &&
           rest.find("..") == std::string_view::npos;
  }

  const std::span<const BatchFile> files_;
  const GalleryOptions& options_;
  const GalleryHost& host_;
  std::vector<GalleryOutcome>& outcomes_;
  std::vector<GalleryPicture> pictures_;
  const std::string pictureFolder_;
  const int32_t jpeg_, webp_;  // formats
};

}  // namespace

std::string ForeignFile(const GalleryOptions& options, size_t files) {
  const auto previous = PreviousFiles(options.folder);
  std::vector<std::string> names{GalleryPageName(0)};
  for (size_t page = 1; page * std::max<size_t>(options.perPage, 1) < files; ++page)
    names.push_back(GalleryPageName(page));
  if (!previous) names.insert(names.end(), {kStyleName, kScriptName});
  for (const std::string& name : names) {
    const std::string path = platform::JoinFolder(options.folder, name);
    if (!(previous && previous->contains(name)) &&
        platform::ExistenceOf(path) == platform::Existence::Yes)
      return path;
  }
  return {};
}

void LeaveOutRepeated(const std::string& folder, std::vector<BatchFile>& files) {
  std::set<std::string> seen{platform::AbsolutePath(ListPath(folder))};
  for (const std::string& name : PreviousFiles(folder).value_or(std::set<std::string>()))
    seen.insert(platform::AbsolutePath(platform::JoinFolder(folder, name)));
  std::erase_if(files, [&](const BatchFile& file) {
    return file.status == Status::Ok && !seen.insert(platform::AbsolutePath(file.name)).second;
  });
}

Status BuildGallery(std::span<const BatchFile> files, const GalleryOptions& options,
                    const GalleryHost& host, std::vector<GalleryOutcome>& outcomes,
                    std::string& failed) {
  return GalleryBuild(files, options, host, outcomes).Run(failed);
}

}  // namespace fotomill
