#include "catalog/search/picture_index.h"

#include <algorithm>
#include <array>
#include <utility>
#include <vector>

#include "core/byte_reader.h"
#include "metadata/tags/sidecar.h"
#include "platform/files.h"

namespace fotomill {

namespace {

constexpr RecordLayout kLayout{"FMWINDX1", 0};

void AddLittle(std::string& data, uint64_t value, int count) {
  for (int i = 0; i < count; ++i) data.push_back(static_cast<char>(value >> (8 * i)));
}

void AddText(std::string& data, const std::string& text) {
  AddLittle(data, text.size(), 4);
  data += text;
}

std::string TakeText(ByteReader& reader) {
  const auto bytes = reader.Take(reader.Le32());
  return {bytes.begin(), bytes.end()};
}

int32_t TakeInteger(ByteReader& reader) { return static_cast<int32_t>(reader.Le32()); }

// The texts of facts, in the order of the store.
template <typename Facts>
auto TextsOf(Facts& facts) {
  auto& tags = facts.tags;
  return std::array{&facts.format, &tags.title,       &tags.description, &tags.comment, &tags.label,
                    &tags.creator, &tags.copyright,   &tags.sublocation, &tags.city,    &tags.state,
                    &tags.country, &tags.countryCode, &tags.camera};
}

std::string DataOf(uint64_t digest, const PictureFacts& facts) {
  std::string data;
  AddLittle(data, digest, 8);
  AddLittle(data, facts.parts, 4);
  AddLittle(data, static_cast<uint64_t>(facts.tags.taken), 8);
  for (const int32_t number : {facts.tags.rating, facts.width, facts.height, facts.faces})
    AddLittle(data, static_cast<uint32_t>(number), 4);
  AddLittle(data, facts.faceKey, 4);
  AddLittle(data, static_cast<uint16_t>(facts.header), 2);
  AddLittle(data, static_cast<uint16_t>(facts.decoded), 2);
  AddLittle(data, facts.tags.keywords.size(), 4);
  for (const std::string* const text : TextsOf(facts)) AddText(data, *text);
  for (const std::string& keyword : facts.tags.keywords) AddText(data, keyword);
  return data;
}

// Adds a file to a digest (FNV-1a, 64 bits).
void Digest(const std::string& path, const platform::FileFacts& facts, uint64_t& digest) {
  const auto time = platform::ModificationTime(path).value_or(platform::ExactTime());
  for (const uint64_t number : {facts.identity, facts.size, static_cast<uint64_t>(time.seconds),
                                static_cast<uint64_t>(time.nanoseconds)}) {
    for (int shift = 0; shift < 64; shift += 8)
      digest = (digest ^ (number >> shift & 0xff)) * 0x100000001b3u;
  }
}

}  // namespace

PictureState StateOf(const std::string& path, const TagSources& sources) {
  const platform::FileFacts facts = platform::FactsOf(path);
  PictureState state{.regular = facts.kind == platform::FileKind::Regular,
                     .size = facts.size,
                     .modified = facts.modified,
                     .digest = 0xcbf29ce484222325u};
  std::vector<std::string> names = SidecarNames(path);
  if (!sources.commentExtension.empty())
    names.push_back(CommentFileName(path, sources.commentFolder, sources.commentExtension));
  Digest(path, facts, state.digest);
  for (const std::string& name : names) {
    const platform::FileFacts beside = platform::FactsOf(name);
    if (beside.kind == platform::FileKind::Missing) continue;
    state.modified = std::max(state.modified, beside.modified);
    Digest(name, beside, state.digest);
  }
  return state;
}

PictureIndex::PictureIndex(std::string path) : store_(std::move(path), kLayout) {}

std::optional<PictureFacts> PictureIndex::Find(const std::string& path,
                                               const PictureState& state) const {
  const StoredRecord* const stored = store_.Find(path, state.size, state.modified);
  if (stored == nullptr) return std::nullopt;
  ByteReader reader({reinterpret_cast<const uint8_t*>(stored->data.data()), stored->data.size()});
  if (reader.Le64() != state.digest) return std::nullopt;
  PictureFacts facts;
  facts.parts = reader.Le32();
  facts.tags.taken = static_cast<int64_t>(reader.Le64());
  for (int32_t* const number : {&facts.tags.rating, &facts.width, &facts.height, &facts.faces})
    *number = TakeInteger(reader);
  facts.faceKey = reader.Le32();
  facts.header = static_cast<Status>(reader.Le16());
  facts.decoded = static_cast<Status>(reader.Le16());
  const uint32_t keywords = reader.Le32();
  for (std::string* const text : TextsOf(facts)) *text = TakeText(reader);
  for (uint32_t i = 0; i < keywords && reader.Ok(); ++i)
    facts.tags.keywords.push_back(TakeText(reader));
  return reader.Ok() && reader.Left() == 0 ? std::optional(std::move(facts)) : std::nullopt;
}

void PictureIndex::Put(const std::string& path, const PictureState& state,
                       const PictureFacts& facts) {
  store_.Put(path,
             {.size = state.size, .modified = state.modified, .data = DataOf(state.digest, facts)});
}

}  // namespace fotomill
