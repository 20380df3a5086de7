// Source: ISO 16684-1:2012, sections 7 and 8; XMP specification part 1, section 7.3.2 (padding).
#include "metadata/xmp/xmp_tag_edit.h"

#include <algorithm>
#include <map>
#include <pugixml.hpp>
#include <utility>

#include "core/utf8.h"
#include "metadata/xmp/xml_markup.h"
#include "metadata/xmp/xmp_names.h"

namespace fotomill {

namespace {

constexpr std::string_view kBlanks = " \t\r\n";
constexpr std::string_view kNewPacket =
    "<?xpacket begin=\"\xEF\xBB\xBF\" id=\"W5M0MpCehiHzreSzNTczkc9d\"?>\n"
    "<x:xmpmeta xmlns:x=\"adobe:ns:meta/\">\n"
    " <rdf:RDF xmlns:rdf=\"http://www.w3.org/1999/02/22-rdf-syntax-ns#\">\n"
    " </rdf:RDF>\n"
    "</x:xmpmeta>\n"
    "<?xpacket end=\"w\"?>";

std::string_view PrefixOf(std::string_view name) {
  const size_t colon = name.find(':');
  return colon == std::string_view::npos ? std::string_view() : name.substr(0, colon);
}
std::string_view LocalOf(std::string_view name) { return name.substr(name.find(':') + 1); }

// A replacement of bytes of the text.
struct Replacement {
  size_t begin = 0, end = 0;
  std::string text;
};

// The namespaces declared in elements and around them.
class Namespaces {
 public:
  explicit Namespaces(const std::vector<XmlElement>& elements) : elements_(elements) {}

  std::string_view Uri(size_t element, std::string_view prefix) {
    for (size_t at = element; at != XmlElement::kNoParent; at = elements_[at].parent) {
      const auto& declared = Declared(at);
      const auto found = declared.find(prefix);
      if (found != declared.end()) return found->second;
    }
    return {};
  }
  std::string_view UriOf(size_t element) { return Uri(element, PrefixOf(elements_[element].name)); }

 private:
  const std::map<std::string_view, std::string_view>& Declared(size_t element) {
    const auto [found, added] = declared_.try_emplace(element);
    if (!added) return found->second;
    for (const XmlAttribute& attribute : elements_[element].attributes) {
      if (attribute.name == "xmlns") found->second.emplace("", attribute.value);
      if (PrefixOf(attribute.name) == "xmlns")
        found->second.emplace(LocalOf(attribute.name), attribute.value);
    }
    return found->second;
  }

  const std::vector<XmlElement>& elements_;
  std::map<size_t, std::map<std::string_view, std::string_view>> declared_;
};

class Editor {
 public:
  explicit Editor(std::string_view text) : text_(text), namespaces_(elements_) {}

  bool Run(std::span<const XmpChange> changes) {
    if (!ScanXml(text_, elements_) || TooDeep() || !FindGraph()) return false;
    for (const XmpChange& change : changes) {
      if (!Apply(change)) return false;
    }
    RemoveEmptied();
    AddNew();
    std::ranges::sort(replacements_, {}, &Replacement::begin);
    return true;
  }

  std::string Made() const {
    std::string made;
    size_t copied = 0;
    for (const Replacement& one : replacements_) {
      made.append(text_.substr(copied, one.begin - copied)).append(one.text);
      copied = one.end;
    }
    return made.append(text_.substr(copied));
  }

 private:
  // A property: an attribute of a description, or an element in it.
  struct Place {
    size_t description = 0;
    const XmlAttribute* attribute = nullptr;
    size_t element = 0;  // without an attribute
  };

  // Namespaces are looked up through all the elements around one.
  bool TooDeep() const {
    constexpr int kMostLevels = 200;
    std::vector<int> levels;
    for (const XmlElement& element : elements_) {
      const int around = element.parent == XmlElement::kNoParent ? 0 : levels[element.parent];
      levels.push_back(around + 1);
      if (around == kMostLevels) return true;
    }
    return false;
  }

  bool FindGraph() {
    for (size_t i = 0; i < elements_.size(); ++i) {
      const bool graph = LocalOf(elements_[i].name) == "RDF" && namespaces_.UriOf(i) == xmp::kRdf;
      // which one counts?
      if (graph && (graph_ != XmlElement::kNoParent || (i > 0 && elements_[i].parent != 0)))
        return false;
      if (graph) graph_ = i;
      const bool inGraph =
          i > 0 && elements_[i].parent == graph_ && graph_ != XmlElement::kNoParent && !graph;
      if (inGraph && LocalOf(elements_[i].name) == "Description" &&
          namespaces_.UriOf(i) == xmp::kRdf)
        descriptions_.push_back(i);
    }
    if (graph_ == XmlElement::kNoParent) return false;
    rdf_ = PrefixOf(elements_[graph_].name);
    for (size_t i = 0; i < elements_.size(); ++i) {
      if (std::ranges::binary_search(descriptions_, elements_[i].parent)) properties_.push_back(i);
      // values that are elsewhere; XMP does not allow it, and readers differ
      const auto refers = [](const XmlAttribute& attribute) {
        return LocalOf(attribute.name) == "nodeID";
      };
      // namespaces are compared as they are written
      const auto hides = [](const XmlAttribute& attribute) {
        return attribute.name.starts_with("xmlns") &&
               attribute.value.find_first_of("&\t\r\n") != std::string_view::npos;
      };
      if (std::ranges::any_of(elements_[i].attributes, refers) ||
          std::ranges::any_of(elements_[i].attributes, hides))
        return false;
    }
    return !rdf_.empty();
  }

  std::vector<Place> Find(const XmpChange& change) {
    std::vector<Place> places;
    for (const size_t description : descriptions_) {
      for (const XmlAttribute& attribute : elements_[description].attributes) {
        if (LocalOf(attribute.name) == change.name && !PrefixOf(attribute.name).empty() &&
            namespaces_.Uri(description, PrefixOf(attribute.name)) == change.uri)
          places.push_back({description, &attribute, 0});
      }
    }
    for (const size_t property : properties_) {
      if (LocalOf(elements_[property].name) == change.name &&
          namespaces_.UriOf(property) == change.uri)
        places.push_back({elements_[property].parent, nullptr, property});
    }
    return places;
  }

  bool Apply(const XmpChange& change) {
    if (std::ranges::any_of(change.values, [](const std::string& v) { return !IsUtf8(v); }))
      return false;
    bool written = change.values.empty();
    bool adds = change.adds;
    for (const Place& place : Find(change)) {
      adds = true;  // at the latest where it was
      if (written || !Replace(place, change)) {
        Remove(place);
      } else {
        written = true;
      }
    }
    if (!written && adds) added_.push_back(&change);
    return true;
  }

  // False if the property cannot be replaced where it is.
  bool Replace(const Place& place, const XmpChange& change) {
    if (place.attribute != nullptr) {
      if (change.form != XmpForm::Text) return false;
      const size_t end = place.attribute->end - 1;
      Put(end - place.attribute->value.size(), end, EscapedXml(change.values.front()));
      return true;
    }
    const XmlElement& element = elements_[place.element];
    if (change.form == XmpForm::Languages &&
        (ReplaceDefault(place.element, change) || AddDefault(place.element, change)))
      return true;
    std::string made = "<";
    made.append(element.name);
    for (const XmlAttribute& attribute : element.attributes) {
      if (PrefixOf(attribute.name) == "xmlns")
        made.append(" ").append(text_.substr(attribute.begin, attribute.end - attribute.begin));
    }
    made.append(">").append(Body(change)).append("</").append(element.name).append(">");
    Put(element.begin, element.end, std::move(made));
    return true;
  }

  // The text in the default language, in a list that has it.
  bool ReplaceDefault(size_t property, const XmpChange& change) {
    for (size_t i = property + 1;
         i < elements_.size() && elements_[i].begin < elements_[property].end; ++i) {
      if (elements_[i].parent == XmlElement::kNoParent ||
          elements_[elements_[i].parent].parent != property || LocalOf(elements_[i].name) != "li" ||
          elements_[i].alone)
        continue;
      const bool usual = std::ranges::any_of(elements_[i].attributes, [](const XmlAttribute& a) {
        return a.name == "xml:lang" && a.value == "x-default";
      });
      if (!usual) continue;
      Put(elements_[i].content, elements_[i].contentEnd, EscapedXml(change.values.front()));
      return true;
    }
    return false;
  }

  // Adds the text in the default language, which comes first, to a list that has only others.
  bool AddDefault(size_t property, const XmpChange& change) {
    for (size_t i = property + 1;
         i < elements_.size() && elements_[i].begin < elements_[property].end; ++i) {
      const XmlElement& list = elements_[i];
      if (list.parent != property || LocalOf(list.name) != "Alt" || list.alone) continue;
      if (!AllHaveLanguages(i)) return false;
      std::string made = "\n     <";
      made.append(rdf_).append(":li xml:lang=\"x-default\">");
      made.append(EscapedXml(change.values.front())).append("</").append(rdf_).append(":li>");
      Put(list.content, list.content, std::move(made));
      return true;
    }
    return false;
  }

  bool AllHaveLanguages(size_t list) const {
    for (size_t i = list + 1; i < elements_.size() && elements_[i].begin < elements_[list].end;
         ++i) {
      const auto isLanguage = [](const XmlAttribute& a) { return a.name == "xml:lang"; };
      if (elements_[i].parent == list && std::ranges::none_of(elements_[i].attributes, isLanguage))
        return false;
    }
    return true;
  }

  std::string Body(const XmpChange& change) const {
    if (change.form == XmpForm::Text) return EscapedXml(change.values.front());
    std::string list(rdf_), made;
    list += change.form == XmpForm::Bag ? ":Bag>" : change.form == XmpForm::Seq ? ":Seq>" : ":Alt>";
    made.append("\n    <").append(list);
    for (const std::string& value : change.values) {
      made.append("\n     <").append(rdf_).append(":li");
      if (change.form == XmpForm::Languages) made += " xml:lang=\"x-default\"";
      made.append(">").append(EscapedXml(value)).append("</").append(rdf_).append(":li>");
    }
    return made.append("\n    </").append(list).append("\n   ");
  }

  void Remove(const Place& place) {
    size_t begin =
        place.attribute != nullptr ? place.attribute->begin : elements_[place.element].begin;
    const size_t end =
        place.attribute != nullptr ? place.attribute->end : elements_[place.element].end;
    begin = text_.find_last_not_of(kBlanks, begin - 1) + 1;
    Put(begin, end, {});
    ++removed_[place.description];
  }

  // Removes descriptions that have no properties any more.
  void RemoveEmptied() {
    std::map<size_t, size_t> elementsIn;
    if (!removed_.empty()) {
      for (const size_t i : properties_) ++elementsIn[elements_[i].parent];
    }
    std::vector<size_t> emptied;  // ascending
    for (const auto& [description, count] : removed_) {
      const auto isProperty = [](const XmlAttribute& attribute) {
        return PrefixOf(attribute.name) != "xmlns" && attribute.name != "xmlns" &&
               LocalOf(attribute.name) != "about";
      };
      const auto attributes =
          static_cast<size_t>(std::ranges::count_if(elements_[description].attributes, isProperty));
      if (attributes + elementsIn[description] == count) emptied.push_back(description);
    }
    std::erase_if(replacements_, [&](const Replacement& one) {
      const auto after = std::ranges::upper_bound(emptied, one.begin, {},
                                                  [this](size_t i) { return elements_[i].begin; });
      return after != emptied.begin() && one.end <= elements_[*(after - 1)].end;
    });
    for (const size_t i : emptied) {
      const size_t begin = text_.find_last_not_of(kBlanks, elements_[i].begin - 1) + 1;
      Put(begin, elements_[i].end, {});
    }
  }

  // Adds the new properties as a description of their own.
  void AddNew() {
    if (added_.empty()) return;
    const XmlElement& graph = elements_[graph_];
    std::map<std::string, std::string_view> prefixes;
    std::string body;
    for (const XmpChange* change : added_) {
      const std::string prefix = FreePrefix(prefixes, *change);
      prefixes.emplace(prefix, change->uri);
      std::string name = prefix;
      name.append(":").append(change->name);
      body.append("   <").append(name).append(">").append(Body(*change));
      body.append("</").append(name).append(">\n");
    }
    std::string made = "\n  <";
    made.append(rdf_).append(":Description ").append(rdf_).append(":about=\"");
    made.append(About()).append("\"");
    for (const auto& [prefix, uri] : prefixes)
      made.append("\n    xmlns:").append(prefix).append("=\"").append(uri).append("\"");
    made.append(">\n").append(body).append("  </").append(rdf_).append(":Description>");
    if (graph.alone) {
      made.insert(0, 1, '>');
      made.append("\n </").append(graph.name).append(">");
      Put(graph.end - 2, graph.end, std::move(made));
    } else {
      const size_t at =
          std::max(text_.find_last_not_of(kBlanks, graph.contentEnd - 1) + 1, graph.content);
      Put(at, at, made);
    }
  }

  // The usual prefix, unless it is that of another namespace in the same description.
  std::string FreePrefix(const std::map<std::string, std::string_view>& prefixes,
                         const XmpChange& change) const {
    std::string prefix(change.prefix);
    const auto taken = [&] {
      const auto found = prefixes.find(prefix);
      return prefix == rdf_ || (found != prefixes.end() && found->second != change.uri);
    };
    while (taken()) prefix += '_';
    return prefix;
  }

  // What the packet is about; the same for all descriptions.
  std::string About() {
    for (const size_t description : descriptions_) {
      for (const XmlAttribute& attribute : elements_[description].attributes) {
        if (LocalOf(attribute.name) == "about" &&
            attribute.value.find('"') == std::string_view::npos)
          return std::string(attribute.value);
      }
    }
    return {};
  }

  void Put(size_t begin, size_t end, std::string text) {
    replacements_.push_back({begin, end, std::move(text)});
  }

  const std::string_view text_;
  std::vector<XmlElement> elements_;
  Namespaces namespaces_;
  size_t graph_ = XmlElement::kNoParent;
  std::string_view rdf_;              // the prefix of RDF
  std::vector<size_t> descriptions_;  // ascending
  std::vector<size_t> properties_;    // the elements in them
  std::vector<Replacement> replacements_;
  std::map<size_t, size_t> removed_;  // properties removed from a description
  std::vector<const XmpChange*> added_;
};

// Adjusts the padding before the end of a packet, so that it keeps its size if possible.
void KeepSize(std::string& packet, size_t size) {
  constexpr size_t kLeastPadding = 64;  // less is just a line break
  const size_t trailer = packet.rfind("<?xpacket end=");
  if (trailer == std::string::npos || trailer == 0) return;
  const size_t begin = packet.find_last_not_of(kBlanks, trailer - 1) + 1;
  const size_t padding = trailer - begin;
  if (packet.size() > size) {
    const size_t less = std::min(packet.size() - size, padding);
    packet.erase(trailer - less, less);
  } else if (packet.size() < size && padding >= kLeastPadding) {
    packet.insert(trailer, size - packet.size(), ' ');
  }
}

}  // namespace

Status EditXmp(std::span<const uint8_t> packet, std::span<const XmpChange> changes,
               std::vector<uint8_t>& made) {
  constexpr size_t kMostBytes = size_t{16} << 20;
  while (!packet.empty() && packet.back() == 0) packet = packet.first(packet.size() - 1);
  const std::string_view text =
      packet.empty()
          ? kNewPacket
          : std::string_view(static_cast<const char*>(static_cast<const void*>(packet.data())),
                             packet.size());
  if (text.size() > kMostBytes || !IsUtf8(text) || text.find('\0') != std::string_view::npos)
    return Status::DamagedFile;
  pugi::xml_document document;
  // the scanner finds positions; a real parser says whether the text is XML
  if (!document.load_buffer(text.data(), text.size(), pugi::parse_default, pugi::encoding_utf8))
    return Status::DamagedFile;
  Editor editor(text);
  if (!editor.Run(changes)) return Status::DamagedFile;
  std::string result = editor.Made();
  if (!packet.empty()) KeepSize(result, text.size());
  made.assign(result.begin(), result.end());
  return Status::Ok;
}

}  // namespace fotomill
