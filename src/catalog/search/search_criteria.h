#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "catalog/search/picture_facts.h"

namespace fotomill {

// An interval of numbers, including its ends.
struct NumberRange {
  int64_t least = INT64_MIN, most = INT64_MAX;
  bool Contains(int64_t number) const { return number >= least && number <= most; }
  bool operator==(const NumberRange&) const = default;
};

// What to search for; empty fields are not searched for. Texts are compared ignoring letter case.
struct SearchCriteria {
  bool any = false;          // find what meets any of them, not all
  std::string name = {};     // of the file: part of it, or a pattern of "*" and "?"
  std::string comment = {};  // part of title, description or comment
  // keywords, each a whole one or a pattern; of a path of keywords ("Places/Rome"), any level
  std::vector<std::string> keywords = {};
  std::string text = {};                  // part of the name or of any text of its tags
  std::string camera = {};                // part of maker and model
  std::string label = {};                 // the color label
  std::vector<std::string> formats = {};  // extensions of rows, from ExtensionsOfFormat
  std::optional<NumberRange> rating = {}, width = {}, height = {};
  std::optional<NumberRange> size = {};   // bytes
  std::optional<NumberRange> taken = {};  // as PictureTags::taken
  bool faces = false;                     // at least one
  bool damaged = false;                   // cannot be decoded completely

  bool operator==(const SearchCriteria&) const = default;
};

// The extensions of all rows with the same kind of file as a row: JPG, JFIF and JPEG.
std::vector<std::string> ExtensionsOfFormat(int32_t row);

// Whether nothing is searched for, so that every file is found.
bool IsEmpty(const SearchCriteria& criteria);

// Whether a file meets the criteria. Asks `factsWith` for the parts of facts needed, cheap ones
// first, and stops asking once the answer is known. It returns null if they cannot be read; the
// file is not found then.
bool Meets(const SearchCriteria& criteria, std::string_view path, uint64_t size,
           const std::function<const PictureFacts*(uint32_t parts)>& factsWith);

// Parse ranges: "A..B", "A..", "..B" or "A". nullopt if malformed or empty.
// Integers: "3..".
std::optional<NumberRange> ParseNumberRange(std::string_view text);
// Bytes, with k, M or G for powers of 1024: "500k..2M".
std::optional<NumberRange> ParseSizeRange(std::string_view text);
// Dates, as precise as needed: "2024..2025-03", "2024-05-31", "2024-05-31 14:03..". A date stands
// for all of its year, month, day, hour or minute.
std::optional<NumberRange> ParseDateRange(std::string_view text);

}  // namespace fotomill
