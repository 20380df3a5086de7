#include "metadata/exif_text.h"

#include <algorithm>
#include <cstring>

#include "core/settings.h"
#include "core/shown_text.h"

namespace fotomill {

namespace {

constexpr uint64_t kGrowth = 4096;  // bytes; the block starts with so many and stays a multiple of them

bool IsPlain(char c) { return c >= 0x20 && c < 0x7f; }

}  // namespace

void ExifText::Directory(int32_t, std::string_view label) {
  Add("DIRECTORY ");
  Add(label);
  Add("\n");
}

void ExifText::Line(const ExifLine& line) {
  Add("    ");
  Add(line.name);
  if (settings.ExifShowTypes != 0) {
    Add(" ");
    Add(ExifTypeLabel(line.value.type));
  }
  Add("\t");
  AddShown(line.text);
  Add("\n");
}

std::string_view ExifText::Text() const { return {reinterpret_cast<const char*>(block_.Data()), used_}; }

void ExifText::Clear() {
  used_ = 0;
  complete_ = true;
}

void ExifText::Add(std::string_view text) {
  if (!complete_ || text.empty()) return;
  if (text.size() > block_.Size() - used_) {
    // A long text grows by half of itself, so that each of its bytes is moved a few times only.
    const uint64_t room = std::max<uint64_t>(text.size(), used_ / 2);
    complete_ = block_.Resize((used_ + room + kGrowth - 1) / kGrowth * kGrowth);
    if (!complete_) return;
  }
  std::memcpy(block_.Data() + used_, text.data(), text.size());
  used_ += text.size();
}

void ExifText::AddShown(std::string_view text) {
  if (std::all_of(text.begin(), text.end(), IsPlain)) {
    Add(text);
  } else {
    Add(EscapeControls(text));
  }
}

}  // namespace fotomill
