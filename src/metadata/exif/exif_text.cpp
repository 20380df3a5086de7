#include "metadata/exif/exif_text.h"

#include <algorithm>
#include <cstring>
#include <string>

#include "core/shown_text.h"

namespace fotomill {

namespace {

// initial size and granularity of the buffer, in bytes
constexpr uint64_t kGrowth = 4096;

// Whether a text is printable ASCII and needs no escaping. Checks eight characters at a time, as
// every value passes through here.
bool IsPlain(std::string_view text) {
  constexpr uint64_t kOnes = 0x0101010101010101, kTops = 0x80 * kOnes;
  const auto plainEight = [](const char* place) {
    uint64_t word;
    std::memcpy(&word, place, sizeof word);
    // results are in the top bit of each byte
    const uint64_t belowBlank = (word - 0x20 * kOnes) & ~word;
    const uint64_t notDelete = (word ^ 0x7f * kOnes) + 0x7f * kOnes;
    return ((belowBlank | ~notDelete | word) & kTops) == 0;
  };
  if (text.size() < 8)
    return std::ranges::all_of(text, [](char c) { return c >= 0x20 && c < 0x7f; });
  for (size_t i = 0; i + 8 < text.size(); i += 8) {
    if (!plainEight(text.data() + i)) return false;
  }
  return plainEight(text.data() + text.size() - 8);
}

char* Put(char* place, std::string_view text) {
  if (!text.empty()) std::memcpy(place, text.data(), text.size());
  return place + text.size();
}

}  // namespace

void ExifText::Directory(int32_t, std::string_view label) {
  constexpr std::string_view kTitle = "DIRECTORY ";
  if (char* place = Room(kTitle.size() + label.size() + 1)) *Put(Put(place, kTitle), label) = '\n';
}

void ExifText::Line(const ExifLine& line) {
  std::string escaped;
  std::string_view text = line.text;
  if (!IsPlain(text)) {
    escaped = EscapeControls(text);
    text = escaped;
  }
  const std::string_view label =
      options_.showTypes ? ExifTypeLabel(line.value.type) : std::string_view();
  constexpr std::string_view kIndent = "    ";
  char* place = Room(kIndent.size() + line.name.size() + (label.empty() ? 0 : 1 + label.size()) +
                     1 + text.size() + 1);
  if (place == nullptr) return;
  place = Put(Put(place, kIndent), line.name);
  if (!label.empty()) place = Put(Put(place, " "), label);
  *place++ = '\t';
  *Put(place, text) = '\n';
}

std::string_view ExifText::Text() const {
  return {reinterpret_cast<const char*>(block_.Data()), used_};
}

void ExifText::Clear() {
  used_ = 0;
  complete_ = true;
}

char* ExifText::Room(uint64_t size) {
  if (!complete_) return nullptr;
  if (size > block_.Size() - used_) {
    // Grows by half, so that the cost of copying stays linear.
    const uint64_t room = std::max(size, used_ / 2);
    complete_ = block_.Resize((used_ + room + kGrowth - 1) / kGrowth * kGrowth);
    if (!complete_) return nullptr;
  }
  char* place = reinterpret_cast<char*>(block_.Data()) + used_;
  used_ += size;
  return place;
}

}  // namespace fotomill
