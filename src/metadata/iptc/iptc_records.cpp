// A dataset:
//
//   offset size  field
//        0    1  0x1C
//        1    1  record; 1: envelope, 2: application
//        2    1  number
//        3    2  size, big-endian; with the top bit set, the rest is the size of the size (up to 4
//                bytes), which follows
//                data
// Records follow each other in ascending order; in practice, datasets do not always. The data may
// be padded with zeros. Source: IPTC, "IPTC-NAA Information Interchange Model Version 4.2" (2014),
// sections 1.5 to 1.7, 5 and 6.
#include "metadata/iptc/iptc_records.h"

#include <algorithm>

#include "core/byte_reader.h"
#include "core/md5.h"
#include "core/utf8.h"

namespace fotomill {

namespace {

constexpr uint8_t kMark = 0x1C, kEnvelope = 1, kApplication = 2;
constexpr uint8_t kCharacterSet = 90;  // of the envelope
constexpr std::string_view kUtf8("\x1B%G", 3);
constexpr uint8_t kTitle = 5, kKeyword = 25, kCreator = 80, kCity = 90, kSublocation = 92,
                  kState = 95, kCountryCode = 100, kCountry = 101, kCopyright = 116,
                  kDescription = 120, kRasterizedCaption = 125, kFirstPreview = 200;
constexpr size_t kMostKeyword = 64, kMostDescription = 2000;  // bytes

struct Dataset {
  uint8_t record = 0, number = 0;
  std::span<const uint8_t> data, whole;
  bool Is(uint8_t wanted) const { return record == kApplication && number == wanted; }
};

// `end` is the offset after the last valid dataset.
std::vector<Dataset> Datasets(std::span<const uint8_t> data, uint64_t& end) {
  std::vector<Dataset> datasets;
  ByteReader bytes(data);
  end = 0;
  while (bytes.Left() > 0 && bytes.U8() == kMark) {
    Dataset dataset;
    dataset.record = bytes.U8();
    dataset.number = bytes.U8();
    uint64_t size = bytes.Be16();
    if ((size & 0x8000) != 0) {
      const uint64_t digits = size & 0x7FFF;
      if (digits > 4) break;
      size = 0;
      for (uint64_t i = 0; i < digits; ++i) size = size << 8 | bytes.U8();
    }
    dataset.data = bytes.Take(size);
    if (!bytes.Ok()) break;
    dataset.whole = data.subspan(end, bytes.Position() - end);
    end = bytes.Position();
    datasets.push_back(dataset);
  }
  return datasets;
}

std::string_view TextOf(std::span<const uint8_t> bytes) {
  return {static_cast<const char*>(static_cast<const void*>(bytes.data())), bytes.size()};
}

bool SaysUtf8(const std::vector<Dataset>& datasets) {
  return std::ranges::any_of(datasets, [](const Dataset& dataset) {
    return dataset.record == kEnvelope && dataset.number == kCharacterSet &&
           TextOf(dataset.data) == kUtf8;
  });
}

std::string Latin1ToUtf8(std::string_view text) {
  std::string made;
  for (const char c : text) {
    const auto byte = static_cast<unsigned char>(c);
    if (byte < 0x80) {
      made.push_back(c);
    } else {
      made.push_back(static_cast<char>(0xC0 | byte >> 6));
      made.push_back(static_cast<char>(0x80 | (byte & 0x3F)));
    }
  }
  return made;
}

std::string Decoded(std::span<const uint8_t> data) {
  std::string_view text = TextOf(data);
  text = text.substr(0, text.find('\0'));
  return IsUtf8(text) ? std::string(text) : Latin1ToUtf8(text);
}

bool IsAscii(std::string_view text) {
  return std::ranges::all_of(text, [](char c) { return static_cast<unsigned char>(c) < 0x80; });
}

struct TextRow {
  uint8_t number;
  std::string IptcTags::*text;
};
constexpr TextRow kTexts[] = {
    {kTitle, &IptcTags::title},         {kDescription, &IptcTags::description},
    {kCopyright, &IptcTags::copyright}, {kSublocation, &IptcTags::sublocation},
    {kCity, &IptcTags::city},           {kState, &IptcTags::state},
    {kCountry, &IptcTags::country},     {kCountryCode, &IptcTags::countryCode},
};

class Editor {
 public:
  Editor(std::span<const uint8_t> data, const IptcChanges& changes, std::vector<uint8_t>& made)
      : data_(data), changes_(changes), made_(made) {}

  Status Run() {
    uint64_t end = 0;
    datasets_ = Datasets(data_, end);
    const auto rest = data_.subspan(end);
    if (datasets_.empty() || !std::ranges::all_of(rest, [](uint8_t byte) { return byte == 0; }))
      return Status::DamagedFile;
    made_.clear();
    converts_ = NeedsUtf8();
    if (converts_) AddOne(kEnvelope, kCharacterSet, kUtf8);
    for (const Dataset& dataset : datasets_) Add(dataset);
    AddMissing(0xFFFF);
    return Status::Ok;
  }

 private:
  // Whether new texts are not ASCII, but the data do not say that they are UTF-8.
  bool NeedsUtf8() const {
    if (SaysUtf8(datasets_)) return false;
    if (changes_.description && !IsAscii(*changes_.description)) return true;
    return changes_.keywords && !std::ranges::all_of(*changes_.keywords, IsAscii);
  }

  void Add(const Dataset& dataset) {
    AddMissing(dataset.record << 8 | dataset.number);
    if (dataset.Is(kKeyword) && changes_.keywords) return;
    if (dataset.Is(kDescription) && changes_.description) return;
    const bool binary = dataset.number == kRasterizedCaption || dataset.number >= kFirstPreview;
    if (converts_ && dataset.record == kEnvelope && dataset.number == kCharacterSet) return;
    if (converts_ && dataset.record == kApplication && !binary && !IsAscii(TextOf(dataset.data)))
      return AddOne(dataset.record, dataset.number, Decoded(dataset.data));
    made_.insert(made_.end(), dataset.whole.begin(), dataset.whole.end());
  }

  // Adds the new datasets that belong before or in place of one.
  void AddMissing(int before) {
    const auto isDue = [&](uint8_t number) { return (kApplication << 8 | number) <= before; };
    if (!keywordsDone_ && isDue(kKeyword)) {
      keywordsDone_ = true;
      for (const std::string& keyword : changes_.keywords.value_or(std::vector<std::string>()))
        AddOne(kApplication, kKeyword, CutText(keyword, kMostKeyword));
    }
    if (!descriptionDone_ && isDue(kDescription)) {
      descriptionDone_ = true;
      const std::string description = changes_.description.value_or(std::string());
      if (!description.empty())
        AddOne(kApplication, kDescription, CutText(description, kMostDescription));
    }
  }

  void AddOne(uint8_t record, uint8_t number, std::string_view text) {
    text = CutText(text, 0x7FFF);
    made_.insert(made_.end(), {kMark, record, number, static_cast<uint8_t>(text.size() >> 8),
                               static_cast<uint8_t>(text.size())});
    made_.insert(made_.end(), text.begin(), text.end());
  }

  const std::span<const uint8_t> data_;
  const IptcChanges& changes_;
  std::vector<uint8_t>& made_;
  std::vector<Dataset> datasets_;
  bool converts_ = false, keywordsDone_ = false, descriptionDone_ = false;
};

}  // namespace

IptcTags ReadIptcTags(std::span<const uint8_t> data) {
  IptcTags tags;
  uint64_t end = 0;
  for (const Dataset& dataset : Datasets(data, end)) {
    if (dataset.record != kApplication || dataset.data.empty()) continue;
    if (dataset.number == kKeyword) tags.keywords.push_back(Decoded(dataset.data));
    if (dataset.number == kCreator) tags.creators.push_back(Decoded(dataset.data));
    for (const TextRow& row : kTexts) {
      if (row.number == dataset.number && (tags.*row.text).empty())
        tags.*row.text = Decoded(dataset.data);
    }
  }
  return tags;
}

Status EditIptc(std::span<const uint8_t> data, const IptcChanges& changes,
                std::vector<uint8_t>& made) {
  return Editor(data, changes, made).Run();
}

bool BlankIptcPlaces(std::span<uint8_t> data) {
  constexpr uint8_t kLocationCode = 26, kLocationName = 27;  // of the contents
  bool found = false;
  uint64_t end = 0;
  for (const Dataset& dataset : Datasets(data, end)) {
    const bool place = dataset.Is(kCity) || dataset.Is(kSublocation) || dataset.Is(kState) ||
                       dataset.Is(kCountryCode) || dataset.Is(kCountry) ||
                       dataset.Is(kLocationCode) || dataset.Is(kLocationName);
    if (!place || dataset.data.empty()) continue;
    std::fill_n(data.begin() + (dataset.data.data() - data.data()), dataset.data.size(),
                uint8_t{' '});
    found = true;
  }
  return found;
}

std::vector<uint8_t> IptcDigest(std::span<const uint8_t> data) {
  const std::string hex = Md5Text(data);
  const auto digit = [](char c) { return c <= '9' ? c - '0' : c - 'a' + 10; };
  std::vector<uint8_t> digest;
  for (size_t i = 0; i + 1 < hex.size(); i += 2)
    digest.push_back(static_cast<uint8_t>(digit(hex[i]) << 4 | digit(hex[i + 1])));
  return digest;
}

}  // namespace fotomill
