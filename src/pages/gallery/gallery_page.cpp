#include "pages/gallery/gallery_page.h"

#include <cstdio>

#include "core/utf8.h"

namespace fotomill {

namespace {

constexpr char32_t kUnknown = 0xFFFD;
constexpr std::string_view kUnknownBytes = "\xEF\xBF\xBD";
// of a picture in the grid: the heights of rows in the style sheet times its shape
constexpr double kRow = 300, kNarrowRow = 150;

std::string Attribute(const char* name, std::string_view value) {
  return std::string(" ") + name + "=\"" + HtmlText(value) + "\"";
}

std::string Decimal(double value) {
  char text[32];
  const auto thousandths = static_cast<long long>(value * 1000 + 0.5);
  std::snprintf(text, sizeof text, "%lld.%03lld", thousandths / 1000, thousandths % 1000);
  return text;
}

// "a.jpg 480w, b.jpg 960w".
std::string SourceSet(const GalleryPicture& picture, bool webp) {
  std::string set;
  for (const GallerySize& size : picture.sizes) {
    const std::string& file = webp ? size.webp : size.jpeg;
    if (file.empty()) continue;
    if (!set.empty()) set += ", ";
    set += file + " " + std::to_string(size.width) + "w";
  }
  return set;
}

std::string PictureItem(const GalleryPicture& picture) {
  const GallerySize &small = picture.sizes.front(), &large = picture.sizes.back();
  const double ratio = static_cast<double>(small.width) / small.height;
  const auto pixels = [ratio](double row) {
    return std::to_string(static_cast<int32_t>(ratio * row + 0.5)) + "px";
  };
  const std::string sizes = "(max-width: 40rem) " + pixels(kNarrowRow) + ", " + pixels(kRow);
  std::string item = "<li style=\"--ratio:" + Decimal(ratio) + "\"><a" +
                     Attribute("id", picture.id) + Attribute("href", large.jpeg);
  if (!picture.details.empty()) item += Attribute("data-details", picture.details);
  if (!picture.original.empty()) item += Attribute("data-original", picture.original);
  item += "><picture>";
  if (!small.webp.empty()) {
    item += "<source type=\"image/webp\"" + Attribute("srcset", SourceSet(picture, true)) +
            Attribute("sizes", sizes) + ">";
  }
  item += "<img" + Attribute("src", small.jpeg);
  if (picture.sizes.size() > 1)
    item += Attribute("srcset", SourceSet(picture, false)) + Attribute("sizes", sizes);
  item += Attribute("width", std::to_string(small.width)) +
          Attribute("height", std::to_string(small.height)) + Attribute("alt", picture.caption) +
          " loading=\"lazy\" decoding=\"async\"></picture>";
  return item + "<span aria-hidden=\"true\">" + HtmlText(picture.caption) + "</span></a></li>\n";
}

std::string PageLinks(const GalleryTexts& texts, size_t number, size_t count) {
  if (count < 2) return {};
  std::string links = "<nav class=\"pages\"" + Attribute("aria-label", texts.pages) + ">\n";
  for (size_t i = 0; i < count; ++i) {
    links += "<a" + Attribute("href", GalleryPageName(i)) +
             (i == number ? " aria-current=\"page\"" : "") + ">" + std::to_string(i + 1) + "</a>\n";
  }
  return links + "</nav>";
}

std::string Button(const char* kind, const std::string& label, const char* sign) {
  return std::string("<button type=\"button\" class=\"") + kind + "\"" +
         Attribute("aria-label", label) + Attribute("title", label) + ">" + sign + "</button>\n";
}

std::string Viewer(const GalleryTexts& texts) {
  return "<dialog class=\"viewer\"" + Attribute("aria-label", texts.viewer) +
         ">\n<figure><img src=\"data:,\" alt=\"\"></figure>\n"
         "<footer aria-live=\"polite\"><p class=\"caption\"></p><p class=\"details\"></p>"
         "<a class=\"original\" href=\"#\" hidden>" +
         HtmlText(texts.original) + "</a><p class=\"position\"></p></footer>\n" +
         Button("close", texts.close, "&#215;") + Button("previous", texts.previous, "&#8249;") +
         Button("next", texts.next, "&#8250;") + "</dialog>";
}

}  // namespace

std::string HtmlText(std::string_view text) {
  std::string html;
  while (!text.empty()) {
    const std::string_view before = text;
    const char32_t c = NextCharacter(text, kUnknown);
    const std::string_view bytes = before.substr(0, before.size() - text.size());
    switch (c) {
      case '&': html += "&amp;"; break;
      case '<': html += "&lt;"; break;
      case '>': html += "&gt;"; break;
      case '"': html += "&quot;"; break;
      case '\'': html += "&#39;"; break;
      case '\t':
      case '\n':
      case '\r': html += ' '; break;
      default: html += c < 0x20 || (c >= 0x7F && c < 0xA0) || c == kUnknown ? kUnknownBytes : bytes;
    }
  }
  return html;
}

std::string UrlPath(std::string_view path) {
  constexpr std::string_view kUnchanged =
      "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789-._~/";
  std::string url;
  for (const char c : path) {
    if (kUnchanged.find(c) != std::string_view::npos) {
      url += c;
      continue;
    }
    char escaped[4];
    std::snprintf(escaped, sizeof escaped, "%%%02X", static_cast<unsigned>(c) & 255u);
    url += escaped;
  }
  return url;
}

std::string GalleryPageName(size_t number) {
  return number == 0 ? "index.html" : "page-" + std::to_string(number + 1) + ".html";
}

std::string GalleryPage(const GalleryTheme& theme, const GalleryTexts& texts,
                        std::span<const GalleryPicture> pictures, size_t number, size_t count) {
  std::string list = "<ul class=\"pictures\">\n";
  for (const GalleryPicture& picture : pictures) list += PictureItem(picture);
  list += "</ul>";
  const struct {
    std::string_view name;
    std::string value;
  } places[] = {
      {"{{language}}", HtmlText(texts.language)},     {"{{title}}", HtmlText(texts.title)},
      {"{{count}}", HtmlText(texts.count)},           {"{{pictures}}", std::move(list)},
      {"{{pages}}", PageLinks(texts, number, count)}, {"{{viewer}}", Viewer(texts)}};
  std::string page;
  // one pass, so that texts with braces stay texts
  for (std::string_view rest = theme.page; !rest.empty();) {
    size_t length = 1;
    std::string_view value = rest.substr(0, 1);
    for (const auto& place : places) {
      if (!rest.starts_with(place.name)) continue;
      length = place.name.size();
      value = place.value;
    }
    page += value;
    rest.remove_prefix(length);
  }
  return page;
}

}  // namespace fotomill
