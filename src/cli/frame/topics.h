#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill::cli {

// Part of a help page that applies to several commands, translated.
struct TopicPart {
  enum class Kind : uint8_t {
    Paragraph,
    Entry,    // list entry: `left` and its description
    Example,  // command lines
  };
  Kind kind;
  std::string text;
  std::string left = {};  // for Entry only
};

// A page of "fotomill help NAME", also a section of the program's man page.
struct Topic {
  const char* name;
  const char* summary;  // in English; no period
  std::vector<TopicPart> (*parts)();
};

// All topics in the order of the help page. FindTopic: null if not found.
std::span<const Topic> Topics();
const Topic* FindTopic(std::string_view name);

// The exit statuses, one entry each.
std::vector<TopicPart> ExitStatusEntries();

}  // namespace fotomill::cli
