#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill {

// The elements of an XML text with their positions, for changes that keep all other bytes. Names
// are as written, with prefixes. Views into the text; positions in bytes.
struct XmlAttribute {
  std::string_view name, value;  // the value with its entities
  size_t begin = 0, end = 0;     // from the name to after the quotation mark
};
struct XmlElement {
  static constexpr size_t kNoParent = SIZE_MAX;
  std::string_view name;
  size_t parent = kNoParent;           // index of the element around it
  size_t begin = 0, end = 0;           // the whole element
  size_t content = 0, contentEnd = 0;  // between its tags; equal if it has no end tag
  bool alone = false;                  // "<name/>", without an end tag
  std::vector<XmlAttribute> attributes = {};
};

// Finds the elements in document order. False if the text is not well-formed or has a document type
// declaration.
bool ScanXml(std::string_view text, std::vector<XmlElement>& elements);

// A text as the content of an element or attribute.
std::string EscapedXml(std::string_view text);

}  // namespace fotomill
