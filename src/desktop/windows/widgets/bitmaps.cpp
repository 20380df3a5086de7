#include "desktop/windows/widgets/bitmaps.h"

#include <wx/rawbmp.h>
#include <wx/settings.h>

#include <cstring>
#include <string>

namespace fotomill::desktop {

namespace {

struct SymbolShape {
  std::string_view name;
  const char* shape;  // in a 16 by 16 square; COLOR is replaced
};

// Line drawings with a common stroke width.
constexpr SymbolShape kSymbols[] = {
    {"back", "<path d='M10 3 L5 8 L10 13'/>"},
    {"forward", "<path d='M6 3 L11 8 L6 13'/>"},
    {"up", "<path d='M3 9 L8 4 L13 9 M8 4 V13'/>"},
    {"below", "<path d='M3.5 6 L8 10.5 L12.5 6'/>"},
    {"folder", "<path d='M1.5 4 V13 H14.5 V5.5 H8 L6.5 3.5 H2 Z'/>"},
    {"home", "<path d='M2 8 L8 2.5 L14 8 M3.5 7 V13.5 H12.5 V7 M6.5 13.5 V9.5 H9.5 V13.5'/>"},
    {"favorite", "<path d='M8 1.8 L9.9 5.9 L14.3 6.4 L11 9.4 L11.9 13.8 L8 11.6 L4.1 13.8 L5 9.4 L1.7 6.4 L6.1 5.9 Z'/>"},
    {"volume", "<path d='M2 9.5 L3.8 3.5 H12.2 L14 9.5 V13 H2 Z M2 9.5 H14 M11 11.3 H12'/>"},
    {"view", "<path d='M1 8 C3 4 6 3 8 3 C10 3 13 4 15 8 C13 12 10 13 8 13 C6 13 3 12 1 8 Z'/><circle cx='8' cy='8' r='2.2'/>"},
    {"slideshow",
     "<path d='M1.5 2.5 H14.5 V11 H1.5 Z M8 11 V13.5 M5 13.5 H11'/><path d='M6.5 4.7 L10.3 6.8 L6.5 8.9 Z' fill='COLOR'/>"},
    {"convert", "<path d='M2 5.5 H12 M9.5 3 L12 5.5 L9.5 8 M14 10.5 H4 M6.5 8 L4 10.5 L6.5 13'/>"},
    {"crop", "<path d='M4.5 1 V11.5 H15 M1 4.5 H11.5 V15'/>"},
    {"effects", "<circle cx='8' cy='8' r='6.2'/><path d='M8 1.8 A6.2 6.2 0 0 1 8 14.2 Z' fill='COLOR'/>"},
    {"filter", "<circle cx='6' cy='6' r='4.2'/><circle cx='10' cy='10' r='4.2'/>"},
    {"transform", "<path d='M2 14 V6 H10 V14 Z M5 3 H13.5 V11.5 M11 3 H13.5 V5.5'/>"},
    {"annotate", "<path d='M3 4.5 V2.5 H13 V4.5 M8 2.5 V13.5 M6 13.5 H10'/>"},
    {"watermark", "<path d='M1.5 3 H14.5 V13 H1.5 Z M8 10.5 H12.5 M5 5.5 C6.2 7 6.8 7.8 6.8 8.8 A1.8 1.8 0 0 1 3.2 8.8 C3.2 7.8 3.8 7 5 5.5 Z'/>"},
    {"matt", "<path d='M1.5 2 H14.5 V14 H1.5 Z M4.5 5 H11.5 V11 H4.5 Z M1.5 2 L4.5 5 M14.5 2 L11.5 5 M1.5 14 L4.5 11 M14.5 14 L11.5 11'/>"},
    {"find", "<path d='M1.5 2.5 H14.5 V7 M1.5 2.5 V13.5 H7 M1.5 11 L5 7 L7.3 9.3'/><circle cx='10.5' cy='10' r='3.2'/><path d='M12.8 12.3 L15 14.5'/>"},
    {"rename", "<path d='M2 11 L10.5 2.5 L13.5 5.5 L5 14 H2 Z M8.5 4.5 L11.5 7.5'/>"},
    {"copy", "<path d='M5.5 5.5 H13.5 V14 H5.5 Z M10.5 5.5 V2 H2.5 V10.5 H5.5'/>"},
    {"move", "<path d='M1.5 4 V13 H14.5 V5.5 H8 L6.5 3.5 H2 Z M5 9.2 H11 M9 7.2 L11 9.2 L9 11.2'/>"},
    {"trash", "<path d='M2.5 4.5 H13.5 M6 4.5 V2.5 H10 V4.5 M4 4.5 L4.7 14 H11.3 L12 4.5 M6.7 7 V11.5 M9.3 7 V11.5'/>"},
    {"print", "<path d='M4.5 6 V2 H11.5 V6 M4.5 11.5 H2 V6 H14 V11.5 H11.5 M4.5 9.5 H11.5 V14 H4.5 Z'/>"},
    {"info", "<circle cx='8' cy='8' r='6.2'/><path d='M8 7.2 V11.5 M8 4.4 V5.4'/>"},
    {"exif", "<path d='M1.5 4.5 H4.5 L6 2.5 H10 L11.5 4.5 H14.5 V13 H1.5 Z'/><circle cx='8' cy='8.5' r='2.6'/>"},
    {"setup",
     "<path d='M2 4.5 H9 M12.5 4.5 H14 M2 11.5 H4 M7.5 11.5 H14'/><circle cx='10.7' cy='4.5' r='1.8'/><circle cx='5.7' cy='11.5' "
     "r='1.8'/>"},
    {"history", "<circle cx='8' cy='8' r='6.2'/><path d='M8 4.2 V8 L10.8 9.6'/>"},
    {"previous", "<path d='M12 3 L5 8 L12 13 Z M3.5 3 V13'/>"},
    {"next", "<path d='M4 3 L11 8 L4 13 Z M12.5 3 V13'/>"},
    {"play", "<path d='M4.5 2.5 L12.5 8 L4.5 13.5 Z' fill='COLOR'/>"},
    {"zoom-in", "<circle cx='7' cy='7' r='4.7'/><path d='M10.5 10.5 L14 14 M4.8 7 H9.2 M7 4.8 V9.2'/>"},
    {"zoom-out", "<circle cx='7' cy='7' r='4.7'/><path d='M10.5 10.5 L14 14 M4.8 7 H9.2'/>"},
    {"fit", "<path d='M2 5 V2 H5 M11 2 H14 V5 M14 11 V14 H11 M5 14 H2 V11 M4.8 6 H11.2 V10 H4.8 Z'/>"},
    {"actual", "<path d='M2.5 5.5 L4.5 4 V12 M10.5 5.5 L12.5 4 V12 M8.3 6.4 V6.6 M8.3 10 V10.2'/>"},
    {"rotate-left", "<path d='M4.2 4.6 A5.2 5.2 0 1 1 2.9 9.2 M4 1.6 V4.9 H7.3'/>"},
    {"rotate-right", "<path d='M11.8 4.6 A5.2 5.2 0 1 0 13.1 9.2 M12 1.6 V4.9 H8.7'/>"},
    {"flip-across", "<path d='M8 2 V14 M6 4.5 L2 11.5 H6 Z M10 4.5 L14 11.5 H10 Z'/>"},
    {"flip-down", "<path d='M2 8 H14 M4.5 6 L11.5 2 V6 Z M4.5 10 L11.5 14 V10 Z'/>"},
    {"full-screen", "<path d='M2 6 V2 H6 M10 2 H14 V6 M14 10 V14 H10 M6 14 H2 V10'/>"},
    {"close", "<path d='M3.5 3.5 L12.5 12.5 M12.5 3.5 L3.5 12.5'/>"},
    {"ascending", "<path d='M1.5 4 H5 M1.5 8 H7 M1.5 12 H9 M12.5 3 V13 M10.5 11 L12.5 13 L14.5 11'/>"},
    {"descending", "<path d='M1.5 4 H9 M1.5 8 H7 M1.5 12 H5 M12.5 3 V13 M10.5 11 L12.5 13 L14.5 11'/>"},
    {"new-tab", "<path d='M1.5 13.5 V5 H5.5 L6.5 2.5 H14.5 V13.5 Z M8 6.3 V11.3 M5.5 8.8 H10.5'/>"},
    {"new-folder", "<path d='M1.5 4 V13 H14.5 V5.5 H8 L6.5 3.5 H2 Z M8 7 V11.4 M5.8 9.2 H10.2'/>"},
    {"undo", "<path d='M5.5 3 L2.5 6 L5.5 9 M2.5 6 H10 A3.5 3.5 0 0 1 10 13 H6'/>"},
    {"redo", "<path d='M10.5 3 L13.5 6 L10.5 9 M13.5 6 H6 A3.5 3.5 0 0 0 6 13 H10'/>"},
    {"cut", "<circle cx='4.2' cy='12' r='2'/><circle cx='11.8' cy='12' r='2'/><path d='M5.2 10.3 L11 2 M10.8 10.3 L5 2'/>"},
    {"paste", "<path d='M5.5 3 H3 V14 H13 V3 H10.5 M5.5 1.8 H10.5 V4.4 H5.5 Z M5.5 8 H10.5 M5.5 11 H10.5'/>"},
    {"grid", "<path d='M2 2 H7 V7 H2 Z M9 2 H14 V7 H9 Z M2 9 H7 V14 H2 Z M9 9 H14 V14 H9 Z'/>"},
    {"list", "<path d='M2 3.5 H3 M5.5 3.5 H14 M2 8 H3 M5.5 8 H14 M2 12.5 H3 M5.5 12.5 H14'/>"},
    {"compare", "<path d='M1.5 3.5 H7 V12.5 H1.5 Z M9 3.5 H14.5 V12.5 H9 Z'/>"},
    {"search", "<circle cx='7' cy='7' r='4.7'/><path d='M10.5 10.5 L14 14'/>"},
    {"archive", "<path d='M2 2.5 H14 V6 H2 Z M3 6 V13.5 H13 V6 M6.5 9 H9.5'/>"},
    {"command", "<path d='M2 4 H14 V12 H2 Z'/><path d='M5 8 H5.2 M8 8 H8.2 M11 8 H11.2' stroke-width='1.8'/>"},
    {"pause", "<path d='M5 3 V13 M11 3 V13' stroke-width='2.6'/>"},
};

std::string HexColor(const wxColour& color) {
  return std::string(color.GetAsString(wxC2S_HTML_SYNTAX).utf8_str());
}

void ReplaceAll(std::string& text, std::string_view from, const std::string& to) {
  for (size_t at = text.find(from); at != std::string::npos; at = text.find(from, at + to.size())) {
    text.replace(at, from.size(), to);
  }
}

}  // namespace

wxBitmap BitmapOf(const RgbImage& image, double scale) {
  if (image.Empty()) return {};
  wxBitmap bitmap(image.width, image.height, 24);
  wxNativePixelData pixels(bitmap);
  if (!pixels) return {};
  wxNativePixelData::Iterator row(pixels);
  for (int32_t y = 0; y < image.height; ++y) {
    std::memcpy(row.m_ptr, image.Row(y), static_cast<size_t>(image.width) * 3);
    row.OffsetY(pixels, 1);
  }
  bitmap.SetScaleFactor(scale);
  return bitmap;
}

wxBitmapBundle Symbol(std::string_view name, int side) {
  return Symbol(name, side, wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOWTEXT));
}

wxBitmapBundle Symbol(std::string_view name, int side, const wxColour& color) {
  for (const SymbolShape& symbol : kSymbols) {
    if (symbol.name != name) continue;
    std::string svg = std::string(
                          "<svg xmlns='http://www.w3.org/2000/svg' width='16' height='16' viewBox='0 0 16 16'><g fill='none' "
                          "stroke='COLOR' stroke-width='1.3' stroke-linecap='round' stroke-linejoin='round'>") +
                      symbol.shape + "</g></svg>";
    ReplaceAll(svg, "COLOR", HexColor(color));
    return wxBitmapBundle::FromSVG(svg.c_str(), wxSize(side, side));
  }
  return {};
}

}  // namespace fotomill::desktop
