// Source: W3C, "Extensible Markup Language (XML) 1.0 (Fifth Edition)", sections 2 and 3.
#include "metadata/xmp/xml_markup.h"

#include <array>
#include <utility>

namespace fotomill {

namespace {

constexpr std::string_view kBlanks = " \t\r\n";

class Scanner {
 public:
  Scanner(std::string_view text, std::vector<XmlElement>& elements)
      : text_(text), elements_(elements) {}

  bool Run() {
    while ((at_ = text_.find('<', at_)) != std::string_view::npos) {
      const std::string_view rest = text_.substr(at_);
      bool fits = false;
      if (rest.starts_with("<!--")) {
        fits = SkipTo("-->");
      } else if (rest.starts_with("<?")) {
        fits = SkipTo("?>");
      } else if (rest.starts_with("<![CDATA[")) {
        fits = SkipTo("]]>");
      } else if (rest.starts_with("</")) {
        fits = EndTag();
      } else if (!rest.starts_with("<!")) {
        fits = StartTag();
      }
      if (!fits) return false;
    }
    return open_.empty() && !elements_.empty();
  }

 private:
  bool SkipTo(std::string_view end) {
    const size_t found = text_.find(end, at_);
    if (found == std::string_view::npos) return false;
    at_ = found + end.size();
    return true;
  }
  void SkipBlanks() { at_ = std::min(text_.find_first_not_of(kBlanks, at_), text_.size()); }
  std::string_view Name() {
    const size_t end = std::min(text_.find_first_of(" \t\r\n=/><\"'", at_), text_.size());
    const std::string_view name = text_.substr(at_, end - at_);
    at_ = end;
    return name;
  }
  bool Take(char c) {
    if (at_ >= text_.size() || text_[at_] != c) return false;
    ++at_;
    return true;
  }

  bool EndTag() {
    const size_t begin = at_;
    at_ += 2;
    const std::string_view name = Name();
    SkipBlanks();
    if (!Take('>') || open_.empty() || elements_[open_.back()].name != name) return false;
    elements_[open_.back()].contentEnd = begin;
    elements_[open_.back()].end = at_;
    open_.pop_back();
    return true;
  }

  bool StartTag() {
    XmlElement element;
    element.begin = at_++;
    element.name = Name();
    if (element.name.empty()) return false;
    if (!open_.empty()) element.parent = open_.back();
    for (SkipBlanks(); at_ < text_.size() && text_[at_] != '>' && text_[at_] != '/'; SkipBlanks()) {
      if (!Attribute(element)) return false;
    }
    element.alone = Take('/');
    if (!Take('>')) return false;
    element.content = element.contentEnd = element.end = at_;
    if (!element.alone) open_.push_back(elements_.size());
    elements_.push_back(std::move(element));
    return true;
  }

  bool Attribute(XmlElement& element) {
    XmlAttribute attribute;
    attribute.begin = at_;
    attribute.name = Name();
    SkipBlanks();
    if (attribute.name.empty() || !Take('=')) return false;
    SkipBlanks();
    const char quote = at_ < text_.size() ? text_[at_] : ' ';
    if (quote != '"' && quote != '\'') return false;
    const size_t end = text_.find(quote, ++at_);
    if (end == std::string_view::npos) return false;
    attribute.value = text_.substr(at_, end - at_);
    attribute.end = at_ = end + 1;
    element.attributes.push_back(attribute);
    return true;
  }

  const std::string_view text_;
  std::vector<XmlElement>& elements_;
  std::vector<size_t> open_;  // elements without their end tags so far
  size_t at_ = 0;
};

}  // namespace

bool ScanXml(std::string_view text, std::vector<XmlElement>& elements) {
  elements.clear();
  return Scanner(text, elements).Run();
}

std::string EscapedXml(std::string_view text) {
  std::string made;
  for (const char c : text) {
    switch (c) {
      case '&': made += "&amp;"; break;
      case '<': made += "&lt;"; break;
      case '>': made += "&gt;"; break;
      case '"': made += "&quot;"; break;
      case '\'': made += "&apos;"; break;
      case '\n': made += "&#xA;"; break;
      case '\r': made += "&#xD;"; break;
      case '\t': made += "&#x9;"; break;
      default:
        // other control characters cannot be written in XML
        if (static_cast<unsigned char>(c) >= 0x20) made.push_back(c);
    }
  }
  return made;
}

}  // namespace fotomill
