// A packet is an RDF graph in XML: rdf:RDF with rdf:Description elements whose attributes and child
// elements are the properties. Values are texts, or lists of rdf:li in an rdf:Bag, rdf:Seq or
// rdf:Alt. Source: ISO 16684-1:2012, section 7.
#include "metadata/xmp/xmp_tags.h"

#include <algorithm>
#include <map>
#include <pugixml.hpp>

#include "metadata/xmp/xmp_names.h"

namespace fotomill {

namespace {

// Parsing takes up to sixteen times this much memory.
constexpr size_t kMostBytes = size_t{16} << 20;

struct SplitName {
  std::string_view prefix, local;
};
SplitName Split(std::string_view name) {
  const size_t colon = name.find(':');
  if (colon == std::string_view::npos) return {{}, name};
  return {name.substr(0, colon), name.substr(colon + 1)};
}

// The prefixes declared in an element and around it. Keeps pointers into the document.
class Prefixes {
 public:
  Prefixes(const Prefixes* outer, const pugi::xml_node& element) : outer_(outer) { Add(element); }
  // With those of all its ancestors; inner declarations win.
  explicit Prefixes(const pugi::xml_node& element) {
    for (pugi::xml_node node = element; node; node = node.parent()) Add(node);
  }
  std::string_view Uri(std::string_view prefix) const {
    const auto found = uris_.find(prefix);
    if (found != uris_.end()) return found->second;
    return outer_ == nullptr ? std::string_view() : outer_->Uri(prefix);
  }

 private:
  void Add(const pugi::xml_node& node) {
    for (const pugi::xml_attribute& attribute : node.attributes()) {
      const SplitName name = Split(attribute.name());
      if (name.prefix == "xmlns") uris_.emplace(name.local, attribute.value());
      if (name.prefix.empty() && name.local == "xmlns") uris_.emplace("", attribute.value());
    }
  }
  const Prefixes* outer_ = nullptr;
  std::map<std::string_view, std::string_view> uris_;
};

struct TextRow {
  std::string_view uri, name;
  std::string XmpTags::*text;
};
// clang-format off
constexpr TextRow kTexts[] = {
    {xmp::kDublinCore,   "title",                    &XmpTags::title},
    {xmp::kDublinCore,   "description",              &XmpTags::description},
    {xmp::kDublinCore,   "rights",                   &XmpTags::copyright},
    {xmp::kBasic,        "Rating",                   &XmpTags::rating},
    {xmp::kBasic,        "Label",                    &XmpTags::label},
    {xmp::kBasic,        "CreateDate",               &XmpTags::created},
    {xmp::kIptcCore,     "Location",                 &XmpTags::sublocation},
    {xmp::kIptcCore,     "CountryCode",              &XmpTags::countryCode},
    {xmp::kPhotoshop,    "City",                     &XmpTags::city},
    {xmp::kPhotoshop,    "State",                    &XmpTags::state},
    {xmp::kPhotoshop,    "Country",                  &XmpTags::country},
    {xmp::kPhotoshop,    "DateCreated",              &XmpTags::dateCreated},
    {xmp::kPhotoshop,    "SidecarForExtension",      &XmpTags::sidecarFor},
    {xmp::kExif,         "DateTimeOriginal",         &XmpTags::taken},
    {xmp::kTiff,         "Make",                     &XmpTags::make},
    {xmp::kTiff,         "Model",                    &XmpTags::model},
    {xmp::kNote,         "HasExtendedXMP",           &XmpTags::extended},
    {xmp::kDigiKam,      "ColorLabel",               &XmpTags::digiKamLabel},
    {xmp::kMicrosoft,    "Rating",                   &XmpTags::microsoftRating},
    {xmp::kMicrosoftOld, "Rating",                   &XmpTags::microsoftRating},
};
struct ListRow {
  std::string_view uri, name;
  std::vector<std::string> XmpTags::*list;
};
constexpr ListRow kLists[] = {
    {xmp::kDublinCore,   "subject",                  &XmpTags::keywords},
    {xmp::kDublinCore,   "creator",                  &XmpTags::creators},
    {xmp::kDigiKam,      "TagsList",                 &XmpTags::digiKamTags},
    {xmp::kLightroom,    "hierarchicalSubject",      &XmpTags::lightroomTags},
    {xmp::kMicrosoft,    "LastKeywordXMP",           &XmpTags::microsoftTags},
    {xmp::kMicrosoftOld, "LastKeywordXMP",           &XmpTags::microsoftTags},
};
// fields of the structure of a place
constexpr TextRow kPlaceTexts[] = {
    {xmp::kIptcExtension, "Sublocation",             &XmpTags::sublocation},
    {xmp::kIptcExtension, "City",                    &XmpTags::city},
    {xmp::kIptcExtension, "ProvinceState",           &XmpTags::state},
    {xmp::kIptcExtension, "CountryName",             &XmpTags::country},
    {xmp::kIptcExtension, "CountryCode",             &XmpTags::countryCode},
};
// clang-format on

class Reader {
 public:
  explicit Reader(XmpTags& tags) : tags_(tags) {}

  void ReadGraph(const pugi::xml_node& rdf) {
    const Prefixes around(rdf);
    for (const pugi::xml_node& description : rdf.children()) {
      const Prefixes prefixes(&around, description);
      const SplitName name = Split(description.name());
      if (name.local != "Description" || prefixes.Uri(name.prefix) != xmp::kRdf) continue;
      for (const pugi::xml_attribute& attribute : description.attributes()) {
        const SplitName property = Split(attribute.name());
        if (property.prefix.empty() || property.prefix == "xmlns") continue;
        const std::string_view uri = prefixes.Uri(property.prefix);
        Take(kTexts, uri, property.local, attribute.value());
        TakeList(uri, property.local, {attribute.value()});
      }
      for (const pugi::xml_node& element : description.children()) ReadProperty(element, prefixes);
    }
  }

 private:
  void ReadProperty(const pugi::xml_node& element, const Prefixes& around) {
    const SplitName name = Split(element.name());
    const Prefixes prefixes(&around, element);
    const std::string_view uri = prefixes.Uri(name.prefix);
    if (uri == xmp::kIptcExtension && name.local == "LocationCreated") {
      ReadPlace(element, prefixes);
      return;
    }
    const auto isWanted = [&](const auto& row) { return row.uri == uri && row.name == name.local; };
    if (std::ranges::none_of(kTexts, isWanted) && std::ranges::none_of(kLists, isWanted)) return;
    const std::vector<std::string> values = ValuesOf(element);
    if (values.empty()) return;
    Take(kTexts, uri, name.local, values.front());
    TakeList(uri, name.local, values);
  }

  // A list, possibly of one, of structures; the first counts. Each level may hold the fields.
  void ReadPlace(const pugi::xml_node& place, const Prefixes& around, int depth = 0) {
    if (!place || depth > 3) return;
    const Prefixes prefixes(&around, place);
    for (const pugi::xml_attribute& attribute : place.attributes()) {
      const SplitName name = Split(attribute.name());
      Take(kPlaceTexts, prefixes.Uri(name.prefix), name.local, attribute.value());
    }
    for (const pugi::xml_node& field : place.children()) {
      const SplitName name = Split(field.name());
      const auto isField = [&](const TextRow& row) { return row.name == name.local; };
      if (std::ranges::none_of(kPlaceTexts, isField)) continue;
      const std::vector<std::string> values = ValuesOf(field);
      if (!values.empty())
        Take(kPlaceTexts, Prefixes(&prefixes, field).Uri(name.prefix), name.local, values.front());
    }
    ReadPlace(place.first_child(), prefixes, depth + 1);
  }

  static pugi::xml_node Child(const pugi::xml_node& element, std::string_view local) {
    return element.find_child(
        [local](const pugi::xml_node& child) { return Split(child.name()).local == local; });
  }

  // A text, which may have qualifiers beside it: rdf:value in an rdf:Description or directly.
  static std::string TextOf(const pugi::xml_node& element) {
    const pugi::xml_node description = Child(element, "Description");
    const pugi::xml_node value = Child(description ? description : element, "value");
    return (value ? value : element).text().get();
  }

  // A text, or the items of a list, the default language first.
  static std::vector<std::string> ValuesOf(const pugi::xml_node& element) {
    std::vector<std::string> values;
    for (const char* kind : {"Bag", "Seq", "Alt"}) {
      const pugi::xml_node list = Child(element, kind);
      if (!list) continue;
      std::string usual;
      for (const pugi::xml_node& item : list.children()) {
        const std::string_view language = item.attribute("xml:lang").value();
        std::string value = TextOf(item);
        if (value.empty()) continue;
        if (*kind == 'A' && language == "x-default" && usual.empty()) {
          usual = std::move(value);
        } else {
          values.push_back(std::move(value));
        }
      }
      if (!usual.empty()) values.insert(values.begin(), std::move(usual));
      return values;
    }
    std::string text = TextOf(element);
    if (!text.empty()) values.push_back(std::move(text));
    return values;
  }

  void Take(std::span<const TextRow> rows, std::string_view uri, std::string_view name,
            std::string_view value) {
    for (const TextRow& row : rows) {
      if (row.uri == uri && row.name == name && (tags_.*row.text).empty()) tags_.*row.text = value;
    }
  }
  void TakeList(std::string_view uri, std::string_view name,
                const std::vector<std::string>& values) {
    for (const ListRow& row : kLists) {
      if (row.uri == uri && row.name == name && (tags_.*row.list).empty()) tags_.*row.list = values;
    }
  }

  XmpTags& tags_;
};

// rdf:RDF, the root or within x:xmpmeta.
pugi::xml_node FindGraph(const pugi::xml_document& document) {
  const auto isNamed = [](const pugi::xml_node& node) { return Split(node.name()).local == "RDF"; };
  const pugi::xml_node root = document.document_element();
  const pugi::xml_node graph = isNamed(root) ? root : root.find_child(isNamed);
  const bool is = graph && Prefixes(graph).Uri(Split(graph.name()).prefix) == xmp::kRdf;
  return is ? graph : pugi::xml_node();
}

}  // namespace

Status ReadXmpTags(std::span<const uint8_t> packet, XmpTags& tags) {
  while (!packet.empty() && packet.back() == 0) packet = packet.first(packet.size() - 1);
  if (packet.size() > kMostBytes) return Status::MemoryAllocationError;
  pugi::xml_document document;
  const auto result = document.load_buffer(packet.data(), packet.size(), pugi::parse_default);
  if (result.status == pugi::status_out_of_memory) return Status::MemoryAllocationError;
  const pugi::xml_node graph = FindGraph(document);
  if (!result || !graph) return Status::DamagedFile;
  Reader(tags).ReadGraph(graph);
  return Status::Ok;
}

int64_t XmpDateNumber(std::string_view text) {
  constexpr size_t kPositions[] = {0, 1, 2, 3, 5, 6, 8, 9, 11, 12, 14, 15, 17, 18};
  if (text.size() < 4) return 0;
  int64_t number = 0;
  bool ended = false;
  for (const size_t at : kPositions) {
    // a zone may follow the minutes
    if (at >= text.size() || text[at] < '0' || text[at] > '9' || (at >= 17 && text[16] != ':'))
      ended = true;
    number = number * 10 + (ended ? 0 : text[at] - '0');
  }
  return number;
}

}  // namespace fotomill
