#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "core/status.h"

namespace fotomill {

// A picture of a gallery in one size.
struct GallerySize {
  int32_t width = 0, height = 0;  // pixels
  std::string jpeg;               // URL relative to the page
  std::string webp = {};          // likewise; empty: none
};

// A picture of a gallery. Texts are UTF-8 and may contain anything; they are escaped.
struct GalleryPicture {
  std::string id;  // letters, digits and "-"
  std::string caption;
  std::string details = {};        // camera and exposure
  std::string original = {};       // URL of the file, escaped; empty: no link
  std::vector<GallerySize> sizes;  // the smallest first, at least one
};

// A gallery's texts in the user's language.
struct GalleryTexts {
  std::string language = "en";
  std::string title, count;
  std::string viewer, close, previous, next, original, pages;  // labels
};

// The files of a theme.
struct GalleryTheme {
  std::string page;    // HTML with {{title}}, {{pictures}} and so on
  std::string style;   // gallery.css
  std::string script;  // gallery.js
};
// The theme that comes with the program.
GalleryTheme BuiltInTheme();

// A text for HTML, also in quoted attributes. Invalid UTF-8 and control characters become U+FFFD.
std::string HtmlText(std::string_view text);
// A path for a URL: everything but letters, digits, "/" and a few others is percent-encoded.
std::string UrlPath(std::string_view path);

// File name of page `number`, from 0: "index.html", "page-2.html" and so on.
std::string GalleryPageName(size_t number);
// Page `number` of `count`.
std::string GalleryPage(const GalleryTheme& theme, const GalleryTexts& texts,
                        std::span<const GalleryPicture> pictures, size_t number, size_t count);

}  // namespace fotomill
