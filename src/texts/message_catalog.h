#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill {

// The translated messages of a language, from a compiled catalog (.mo). The system's reader is not
// used, as it depends on the locale, and translates nothing on systems with only C.UTF-8.
//
// Source of the format and of plural formulas: GNU gettext manual, "The Format of GNU MO Files"
// and "Additional functions for plural forms".
class MessageCatalog {
 public:
  MessageCatalog() = default;
  MessageCatalog(const MessageCatalog&) = delete;
  MessageCatalog& operator=(const MessageCatalog&) = delete;

  // Reads a catalog; false if the file cannot be read or is damaged. Replaces earlier messages.
  bool Load(const std::string& path);
  // Parses a catalog in memory.
  bool Parse(std::string bytes);

  // The translation of a message, NUL-terminated and owned by the catalog. Null if there is none.
  const char* Find(std::string_view message) const;
  // The plural form for a count, of the message with this singular. Null if there is none.
  const char* FindPlural(std::string_view singular, uint64_t count) const;

 private:
  struct Message {
    std::string_view key;          // the message, or its singular form
    std::string_view translation;  // all forms, separated by NULs
  };

  std::string bytes_;
  std::vector<Message> messages_;  // sorted by key
  std::string plural_;             // the formula of n

  const Message* Lookup(std::string_view key) const;
};

// The value of a plural formula in C's syntax, such as "n != 1" or "n%10==1 && n%100!=11 ? 0 : 1".
// 0 if the formula is invalid.
uint64_t PluralForm(std::string_view formula, uint64_t count);

}  // namespace fotomill
