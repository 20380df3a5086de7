#pragma once

#include <cstdint>
#include <initializer_list>
#include <map>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill {

enum class PageOptionKind {
  Text,
  Texts,   // several; as a value separated by commas
  Number,  // an integer
  Choice,  // one of several words
  Flag,
};

// An option for pages: a row from which the command line and windows make what they need. Texts are
// English, for Tr.
struct PageOption {
  const char* name;  // "grid"
  PageOptionKind kind = PageOptionKind::Flag;
  const char* label = nullptr;    // in a window; null for a flag: its help
  const char* shownAs = nullptr;  // stands for the value in the command line's help
  const char* help = nullptr;
  const char* usual = "";  // the value if none is given
  const char* hint = "";   // shown in the empty field of a window: such a value
  int32_t least = 0, most = 0;
  std::initializer_list<const char*> choices = {};  // an array that lives as long as the program
  std::initializer_list<const char*> choiceLabels = {};  // in a window, likewise
  std::vector<std::string> (*examples)() = nullptr;      // values to offer for a text; null: none
};

// Values of options by name, as text. Options without value, or with an empty one, are not given.
class PageValues {
 public:
  void Set(std::string_view name, std::string_view value);
  void SetFlag(std::string_view name, bool on) { Set(name, on ? "yes" : ""); }

  const std::string& Text(std::string_view name) const;  // empty if not given
  bool Flag(std::string_view name) const { return !Text(name).empty(); }
  int32_t Number(std::string_view name, int32_t usual = 0) const;
  std::vector<std::string> Texts(std::string_view name) const;  // without blanks around them
  bool operator==(const PageValues&) const = default;

 private:
  std::map<std::string, std::string, std::less<>> values_;
};

}  // namespace fotomill
