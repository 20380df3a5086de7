#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill::cli {

// A piece of a page about what commands have in common, in the user's language.
struct TopicPart {
  enum class Kind : uint8_t {
    Paragraph,
    Entry,    // `left` and what it is, one of a list
    Example,  // lines as they are typed
  };
  Kind kind;
  std::string text;
  std::string left = {};  // of an entry only
};

// A page of "fotomill help NAME", and a section of the man page of the program.
struct Topic {
  const char* name;
  const char* summary;  // in English; no period
  std::vector<TopicPart> (*parts)();
};

// All topics in the order of the help page; null from FindTopic if there is none of that name.
std::span<const Topic> Topics();
const Topic* FindTopic(std::string_view name);

// The exit statuses, one entry each.
std::vector<TopicPart> ExitStatusEntries();

}  // namespace fotomill::cli
