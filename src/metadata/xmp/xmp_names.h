#pragma once

#include <string_view>

namespace fotomill {

// Namespaces of XMP properties. Sources: ISO 16684-1:2012, section 8; IPTC Photo Metadata Standard
// 2023; Metadata Working Group, "Guidelines for Handling Image Metadata 2.0".
namespace xmp {
inline constexpr std::string_view kRdf = "http://www.w3.org/1999/02/22-rdf-syntax-ns#";
inline constexpr std::string_view kDublinCore = "http://purl.org/dc/elements/1.1/";
inline constexpr std::string_view kBasic = "http://ns.adobe.com/xap/1.0/";
inline constexpr std::string_view kNote = "http://ns.adobe.com/xmp/note/";
inline constexpr std::string_view kPhotoshop = "http://ns.adobe.com/photoshop/1.0/";
inline constexpr std::string_view kExif = "http://ns.adobe.com/exif/1.0/";
inline constexpr std::string_view kTiff = "http://ns.adobe.com/tiff/1.0/";
inline constexpr std::string_view kIptcCore = "http://iptc.org/std/Iptc4xmpCore/1.0/xmlns/";
inline constexpr std::string_view kIptcExtension = "http://iptc.org/std/Iptc4xmpExt/2008-02-29/";
// Of other programs, which prefer their own copies of keywords, ratings and labels.
inline constexpr std::string_view kDigiKam = "http://www.digikam.org/ns/1.0/";
inline constexpr std::string_view kLightroom = "http://ns.adobe.com/lightroom/1.0/";
inline constexpr std::string_view kMicrosoft = "http://ns.microsoft.com/photo/1.0/";
inline constexpr std::string_view kMicrosoftOld = "http://ns.microsoft.com/photo/1.0";
}  // namespace xmp

}  // namespace fotomill
