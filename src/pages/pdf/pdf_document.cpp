#include "pages/pdf/pdf_document.h"

#include <algorithm>
#include <cstdio>

#include "core/md5.h"
#include "platform/clock.h"
#include "platform/folders.h"

namespace fotomill {

namespace {

constexpr double kPoints = 1 / kMmPerPoint;  // in a millimeter

std::string Pair(Point point) { return PdfNumber(point.x) + " " + PdfNumber(point.y) + " "; }

std::string ColorOf(Color color) {
  const auto part = [color](int shift) { return PdfNumber((color >> shift & 255) / 255.0) + " "; };
  return part(0) + part(8) + part(16);
}

std::string PathOf(const std::vector<Point>& corners) {
  std::string path;
  for (size_t i = 0; i < corners.size(); ++i) path += Pair(corners[i]) + (i == 0 ? "m " : "l ");
  return path + "h ";
}

std::string LineOf(const LineItem& line) {
  std::string dash;
  if (line.dash > 0) dash = std::string("[") + PdfNumber(line.dash) + "] 0 d ";
  return "q " + dash + ColorOf(line.color) + "RG " + PdfNumber(line.width) + " w " +
         Pair(line.from) + "m " + Pair(line.to) + "l S Q\n";
}

// A path as a file URI. Source: RFC 8089 and RFC 3986.
std::string FileUri(const std::string& file) {
  constexpr std::string_view kUnchanged =
      "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789-._~/";
  std::string uri = "file://";
  for (const char c : platform::AbsolutePath(file)) {
    if (kUnchanged.find(c) != std::string_view::npos) {
      uri += c;
      continue;
    }
    char escaped[4];
    std::snprintf(escaped, sizeof escaped, "%%%02X", static_cast<unsigned>(c) & 255u);
    uri += escaped;
  }
  return uri;
}

std::span<const uint8_t> BytesOf(const std::string& text) {
  return {reinterpret_cast<const uint8_t*>(text.data()), text.size()};
}

}  // namespace

Status PdfDocument::Create(const std::string& path) {
  RETURN_IF_BAD(file_.Create(path));
  tree_ = file_.NewObject();
  fontNames_ = file_.NewObject();
  return Status::Ok;
}

Status PdfDocument::AddPicture(size_t id, const PdfPicture& picture) {
  const int32_t object = file_.NewObject();
  RETURN_IF_BAD(pictureWriter_.Write(file_, picture, object));
  pictures_[id] = {object, picture.orientation};
  return Status::Ok;
}

// The matrix maps the unit square of an image, with its top row at y = 1, to the page.
void PdfDocument::Put(const PictureItem& item, std::string& content, std::string& names) const {
  const auto found = pictures_.find(item.picture);
  if (found == pictures_.end()) return;
  const Turn turn = TurnOf(found->second.orientation);
  const auto place = [&](double u, double v) {
    const double x = turn.flipX ? 1 - u : u, y = turn.flipY ? 1 - v : v;
    return item.corner + item.across * (turn.swap ? y : x) + item.down * (turn.swap ? x : y);
  };
  const Point bottom = place(0, 1), across = place(1, 1) - bottom, up = place(0, 0) - bottom;
  const std::string name = std::string("/P") + std::to_string(item.picture);
  content += "q ";
  if (!item.clip.empty()) content += PathOf(item.clip) + "W n ";
  content += Pair(across) + Pair(up) + Pair(bottom) + "cm " + name + " Do Q\n";
  const std::string entry = name + " " + PdfReference(found->second.object) + " ";
  if (names.find(entry) == std::string::npos) names += entry;
}

std::string PdfDocument::LinksOf(const Page& page) {
  std::string links;
  for (const PageItem& item : page.items) {
    const auto* const link = std::get_if<LinkItem>(&item);
    if (link == nullptr) continue;
    const int32_t object = file_.NewObject();
    const Box& box = link->box;
    file_.Write(object, std::string("<< /Type /Annot /Subtype /Link /Border [0 0 0] /Rect [") +
                            Pair(Point{box.x, page.height - box.Bottom()} * kPoints) +
                            Pair(Point{box.Right(), page.height - box.y} * kPoints) +
                            "] /A << /S /URI /URI " + PdfText(FileUri(link->file)) + " >> >>");
    links += PdfReference(object) + " ";
  }
  return links;
}

Status PdfDocument::AddPage(const Page& page) {
  constexpr Color kWhite = 0xFFFFFF;
  // millimeters from the top left corner
  std::string content =
      std::string("2.83464567 0 0 -2.83464567 0 ") + PdfNumber(page.height * kPoints) + " cm\n";
  std::string names;
  if (page.background != kWhite) {
    content += ColorOf(page.background) + "rg 0 0 " + PdfNumber(page.width) + " " +
               PdfNumber(page.height) + " re f\n";
  }
  for (const PageItem& item : page.items) {
    if (const auto* const picture = std::get_if<PictureItem>(&item)) Put(*picture, content, names);
    if (const auto* const line = std::get_if<LineItem>(&item)) content += LineOf(*line);
    if (const auto* const polygon = std::get_if<PolygonItem>(&item))
      content += ColorOf(polygon->color) + "rg " + PathOf(polygon->corners) + "f\n";
    if (const auto* const text = std::get_if<TextItem>(&item))
      RETURN_IF_BAD(fonts_.Show(*text, content));
  }
  const int32_t stream = file_.NewObject(), object = file_.NewObject();
  RETURN_IF_BAD(file_.WriteDeflated(stream, "", BytesOf(content)));
  const std::string links = LinksOf(page);
  file_.Write(object, std::string("<< /Type /Page /Parent ") + PdfReference(tree_) +
                          " /MediaBox [0 0 " + PdfNumber(page.width * kPoints) + " " +
                          PdfNumber(page.height * kPoints) + "] /Contents " + PdfReference(stream) +
                          (links.empty() ? "" : " /Annots [" + links + "]") +
                          " /Resources << /Font " + PdfReference(fontNames_) + " /XObject << " +
                          names + ">> >> >>");
  pages_.push_back(object);
  for (const Bookmark& mark : page.bookmarks)
    bookmarks_.push_back({mark.title, object, (page.height - mark.y) * kPoints});
  return Status::Ok;
}

int32_t PdfDocument::WriteOutline() {
  if (bookmarks_.empty()) return 0;
  const int32_t root = file_.NewObject();
  std::vector<int32_t> objects;
  for (size_t i = 0; i < bookmarks_.size(); ++i) objects.push_back(file_.NewObject());
  for (size_t i = 0; i < bookmarks_.size(); ++i) {
    const Entry& entry = bookmarks_[i];
    std::string value = std::string("<< /Title ") + PdfText(entry.title) + " /Parent " +
                        PdfReference(root) + " /Dest [" + PdfReference(entry.page) + " /XYZ null " +
                        PdfNumber(entry.y) + " null]";
    if (i > 0) value += std::string(" /Prev ") + PdfReference(objects[i - 1]);
    if (i + 1 < objects.size()) value += std::string(" /Next ") + PdfReference(objects[i + 1]);
    file_.Write(objects[i], value + " >>");
  }
  file_.Write(root, std::string("<< /Type /Outlines /First ") + PdfReference(objects.front()) +
                        " /Last " + PdfReference(objects.back()) + " /Count " +
                        std::to_string(objects.size()) + " >>");
  return root;
}

Status PdfDocument::Finish(const std::string& title, platform::Existing existing) {
  RETURN_IF_BAD(fonts_.Write(file_, fontNames_));
  std::string kids;
  for (const int32_t page : pages_) kids += PdfReference(page) + " ";
  file_.Write(tree_, std::string("<< /Type /Pages /Count ") + std::to_string(pages_.size()) +
                         " /Kids [" + kids + "] >>");
  const int32_t outline = WriteOutline();
  const int32_t catalog = file_.NewObject(), info = file_.NewObject();
  file_.Write(catalog, std::string("<< /Type /Catalog /Pages ") + PdfReference(tree_) +
                           " /ViewerPreferences << /DisplayDocTitle true /PrintScaling /None >>" +
                           (outline == 0 ? ""
                                         : std::string(" /PageMode /UseOutlines /Outlines ") +
                                               PdfReference(outline)) +
                           " >>");
  file_.Write(info, std::string("<< /Title ") + PdfText(title) +
                        " /Producer (Fotomill Professional " + FOTOMILL_VERSION + ") >>");
  const std::string key = title + kids + std::to_string(platform::Now());
  return file_.Finish(catalog, info, Md5Text(BytesOf(key)), existing);
}

}  // namespace fotomill
