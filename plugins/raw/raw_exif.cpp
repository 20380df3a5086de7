#include "raw_exif.h"

#include <cmath>
#include <cstring>
#include <ctime>
#include <string>

#include "fotomill_plugin_kit.h"

namespace {

enum Type : uint16_t { kAscii = 2, kShort = 3, kLong = 4, kRational = 5 };

// A little-endian directory with the data of its entries behind it.
class Directory {
 public:
  void Short(uint16_t tag, uint32_t value) { Add(tag, kShort, 1, Number(value)); }
  void Long(uint16_t tag, uint32_t value) { Add(tag, kLong, 1, Number(value)); }
  void Text(uint16_t tag, const std::string& text) {
    if (!text.empty())
      Add(tag, kAscii, static_cast<uint32_t>(text.size()) + 1, {text.begin(), text.end() + 1});
  }
  void Ratio(uint16_t tag, double value) {
    if (!(value > 0 && value < 1e6)) return;
    const bool small = value < 1;  // exposure times are better as 1/n
    std::vector<uint8_t> bytes =
        Number(small ? 1000000 : static_cast<uint32_t>(std::lround(value * 1000)));
    const auto below = Number(small ? static_cast<uint32_t>(std::lround(1000000 / value)) : 1000);
    bytes.insert(bytes.end(), below.begin(), below.end());
    Add(tag, kRational, 1, bytes);
  }
  // The directory at `place` in the block.
  std::vector<uint8_t> Bytes(size_t place) const {
    std::vector<uint8_t> out(Size()), data;
    FmwPutLe(out.data(), static_cast<uint32_t>(entries_.size()), 2);
    for (size_t i = 0; i < entries_.size(); ++i) {
      uint8_t* const at = out.data() + 2 + 12 * i;
      const Entry& entry = entries_[i];
      FmwPutLe(at, entry.tag, 2);
      FmwPutLe(at + 2, entry.type, 2);
      FmwPutLe(at + 4, entry.count, 4);
      if (entry.data.size() <= 4) {
        std::memcpy(at + 8, entry.data.data(), entry.data.size());
      } else {
        FmwPutLe(at + 8, static_cast<uint32_t>(place + out.size() + data.size()), 4);
        data.insert(data.end(), entry.data.begin(), entry.data.end());
        if (data.size() % 2 != 0) data.push_back(0);
      }
    }
    out.insert(out.end(), data.begin(), data.end());
    return out;
  }
  size_t Size() const { return 2 + 12 * entries_.size() + 4; }

 private:
  struct Entry {
    uint16_t tag, type;
    uint32_t count;
    std::vector<uint8_t> data;
  };
  static std::vector<uint8_t> Number(uint32_t value) {
    std::vector<uint8_t> bytes(4);
    FmwPutLe(bytes.data(), value, 4);
    return bytes;
  }
  void Add(uint16_t tag, Type type, uint32_t count, std::vector<uint8_t> data) {
    entries_.push_back({tag, type, count, std::move(data)});
  }
  std::vector<Entry> entries_;  // by tag
};

template <size_t size>
std::string TextOf(const char (&text)[size]) {
  return {text, strnlen(text, size)};
}

std::string TimeText(time_t time) {
  std::tm parts = {};
  char text[20] = {};
  if (time <= 0 || localtime_r(&time, &parts) == nullptr) return {};
  return strftime(text, sizeof text, "%Y:%m:%d %H:%M:%S", &parts) > 0 ? text : std::string();
}

}  // namespace

std::vector<uint8_t> ExifOf(const libraw_data_t& raw) {
  constexpr size_t kHead = 8;
  Directory shot;
  shot.Ratio(0x829a, raw.other.shutter);
  shot.Ratio(0x829d, raw.other.aperture);
  if (raw.other.iso_speed >= 1 && raw.other.iso_speed < 65536)
    shot.Short(0x8827, static_cast<uint32_t>(raw.other.iso_speed));
  shot.Text(0x9003, TimeText(raw.other.timestamp));
  shot.Ratio(0x920a, raw.other.focal_len);
  const auto directory = [&](size_t shotPlace) {
    Directory camera;
    camera.Text(0x010f, TextOf(raw.idata.make));
    camera.Text(0x0110, TextOf(raw.idata.model));
    camera.Short(0x0112, 1);
    camera.Text(0x0132, TimeText(raw.other.timestamp));
    camera.Text(0x013b, TextOf(raw.other.artist));
    camera.Long(0x8769, static_cast<uint32_t>(shotPlace));
    return camera.Bytes(kHead);
  };
  const size_t shotPlace = kHead + directory(0).size();
  std::vector<uint8_t> block = {'I', 'I', 42, 0, kHead, 0, 0, 0};
  for (const std::vector<uint8_t>& part : {directory(shotPlace), shot.Bytes(shotPlace)})
    block.insert(block.end(), part.begin(), part.end());
  return block;
}
