#include "texts/message_catalog.h"

#include <algorithm>
#include <array>
#include <span>
#include <utility>

#include "core/byte_reader.h"
#include "core/text.h"
#include "platform/files.h"

namespace fotomill {

namespace {

// File layout, 32-bit integers in the byte order of the magic number:
//
//    0  4  0x950412DE
//    4  4  revision; the major one, in the upper half, is 0
//    8  4  number of messages
//   12  4  offset of the table of messages: length and offset of each, sorted
//   16  4  offset of the table of translations, same layout
//
// Strings are NUL-terminated; the NUL is not counted in their length. A message with a plural
// consists of both forms, separated by a NUL. The empty message is the header.
constexpr uint32_t kMagic = 0x950412DE, kSwappedMagic = 0xDE120495;
constexpr uint64_t kMostBytes = 64 << 20;

class PluralFormula {
 public:
  PluralFormula(std::string_view text, uint64_t count) : text_(text), count_(count) {}

  uint64_t Value() {
    const uint64_t value = Choice();
    Blanks();
    return valid_ && text_.empty() ? value : 0;
  }

 private:
  struct Operator {
    std::string_view sign;
    int level;  // higher binds tighter
  };
  // Longer operators first.
  static constexpr auto kOperators = std::to_array<Operator>({{"||", 1},
                                                              {"&&", 2},
                                                              {"==", 3},
                                                              {"!=", 3},
                                                              {"<=", 4},
                                                              {">=", 4},
                                                              {"<", 4},
                                                              {">", 4},
                                                              {"+", 5},
                                                              {"-", 5},
                                                              {"*", 6},
                                                              {"/", 6},
                                                              {"%", 6}});
  static constexpr int kLevels = 6;
  static constexpr int kDeepest = 50;

  std::string_view text_;
  const uint64_t count_;
  int depth_ = 0;
  bool valid_ = true;

  uint64_t Fail() {
    valid_ = false;
    text_ = {};
    return 0;
  }
  void Blanks() {
    while (!text_.empty() && text_.front() == ' ') text_.remove_prefix(1);
  }
  bool Take(std::string_view sign) {
    Blanks();
    if (!text_.starts_with(sign)) return false;
    text_.remove_prefix(sign.size());
    return true;
  }

  uint64_t Choice() {
    if (++depth_ > kDeepest) return Fail();
    uint64_t value = Binary(1);
    if (Take("?")) {
      const uint64_t yes = Choice();
      if (!Take(":")) return Fail();
      const uint64_t no = Choice();
      value = value != 0 ? yes : no;
    }
    --depth_;
    return value;
  }

  uint64_t Binary(int level) {
    if (level > kLevels) return Unary();
    uint64_t left = Binary(level + 1);
    for (;;) {
      const auto found = std::ranges::find_if(
          kOperators, [&](const Operator& row) { return row.level == level && Take(row.sign); });
      if (found == kOperators.end()) return left;
      left = Apply(found->sign, left, Binary(level + 1));
    }
  }

  uint64_t Apply(std::string_view sign, uint64_t left, uint64_t right) {
    switch (sign[0]) {
      case '|': return left != 0 || right != 0;
      case '&': return left != 0 && right != 0;
      case '=': return left == right;
      case '!': return left != right;
      case '<': return sign.size() == 2 ? left <= right : left < right;
      case '>': return sign.size() == 2 ? left >= right : left > right;
      case '+': return left + right;
      case '-': return left - right;
      case '*': return left * right;
      default: break;
    }
    if (right == 0) return 0;
    return sign == "/" ? left / right : left % right;
  }

  uint64_t Unary() {
    if (++depth_ > kDeepest) return Fail();
    const uint64_t value = Operand();
    --depth_;
    return value;
  }

  uint64_t Operand() {
    if (Take("!")) return Unary() == 0;
    if (Take("n")) return count_;
    if (Take("(")) {
      const uint64_t value = Choice();
      return Take(")") ? value : Fail();
    }
    if (text_.empty() || !IsDigit(text_.front())) return Fail();
    uint64_t number = 0;
    for (; !text_.empty() && IsDigit(text_.front()); text_.remove_prefix(1)) {
      number = number * 10 + static_cast<uint64_t>(text_.front() - '0');
    }
    return number;
  }
};

// The text between `name` and the next semicolon or line end of the header.
std::string_view HeaderValue(std::string_view header, std::string_view name) {
  const size_t begin = header.find(name);
  if (begin == std::string_view::npos) return {};
  const std::string_view rest = header.substr(begin + name.size());
  return rest.substr(0, rest.find_first_of(";\n"));
}

}  // namespace

uint64_t PluralForm(std::string_view formula, uint64_t count) {
  return PluralFormula(formula, count).Value();
}

bool MessageCatalog::Load(const std::string& path) {
  std::string bytes;
  const auto result = platform::ReadWholeFile(path, kMostBytes, bytes);
  return Parse(result == platform::ReadResult::Done ? std::move(bytes) : std::string());
}

bool MessageCatalog::Parse(std::string bytes) {
  messages_.clear();
  plural_.clear();
  bytes_ = std::move(bytes);
  const std::span file(reinterpret_cast<const uint8_t*>(bytes_.data()), bytes_.size());
  ByteReader magic(file);
  const uint32_t first = magic.Le32();
  if (first != kMagic && first != kSwappedMagic) return false;
  const auto number = [&](ByteReader& reader) {
    return first == kMagic ? reader.Le32() : reader.Be32();
  };
  const auto string = [&](ByteReader& table) -> std::string_view {
    const uint64_t length = number(table), offset = number(table);
    if (!table.Ok() || offset + length >= bytes_.size() || bytes_[offset + length] != '\0') {
      return {};
    }
    return std::string_view(bytes_).substr(offset, length);
  };
  ByteReader head(file);
  head.Skip(4);
  const uint32_t revision = number(head), count = number(head);
  ByteReader keys(file), translations(file);
  keys.Seek(number(head));
  translations.Seek(number(head));
  if (!head.Ok() || revision >> 16 != 0 || count > bytes_.size() / 16) return false;
  messages_.reserve(count);
  for (uint32_t i = 0; i < count; ++i) {
    const std::string_view key = string(keys), translation = string(translations);
    if (translation.empty()) continue;
    messages_.push_back({key.substr(0, key.find('\0')), translation});
  }
  std::ranges::sort(messages_, {}, &Message::key);
  if (const char* const header = Find("")) plural_ = HeaderValue(header, "plural=");
  return keys.Ok() && translations.Ok() && !messages_.empty();
}

const MessageCatalog::Message* MessageCatalog::Lookup(std::string_view key) const {
  const auto found = std::ranges::lower_bound(messages_, key, {}, &Message::key);
  return found == messages_.end() || found->key != key ? nullptr : &*found;
}

const char* MessageCatalog::Find(std::string_view message) const {
  const Message* const found = Lookup(message);
  return found == nullptr ? nullptr : found->translation.data();
}

const char* MessageCatalog::FindPlural(std::string_view singular, uint64_t count) const {
  const Message* const found = Lookup(singular);
  if (found == nullptr) return nullptr;
  const uint64_t wanted = PluralForm(plural_, count);
  std::string_view forms = found->translation;
  for (uint64_t form = 0; form < wanted; ++form) {
    const size_t end = forms.find('\0');
    if (end == std::string_view::npos) break;
    forms.remove_prefix(end + 1);
  }
  return forms.data();
}

}  // namespace fotomill
