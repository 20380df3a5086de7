#include "catalog/similar/hash_store.h"

#include <bit>
#include <span>
#include <utility>

#include "core/byte_reader.h"

namespace fotomill {

namespace {

constexpr RecordLayout kLayout{"FMWHASH1", 96};
constexpr uint64_t kDigestBytes = 16;
constexpr uint32_t kHasHashes = 1, kHasDigest = 2, kHasSharpness = 4, kSeveralPages = 8,
                   kKnowsPages = 16;

void AddLittle(std::string& data, uint64_t value, int count) {
  for (int i = 0; i < count; ++i) data.push_back(static_cast<char>(value >> (8 * i)));
}

uint8_t Nibble(char c) { return static_cast<uint8_t>(c <= '9' ? c - '0' : c - 'a' + 10); }

std::string DataOf(const HashRecord& record) {
  std::string data;
  AddLittle(data, static_cast<uint32_t>(record.width), 4);
  AddLittle(data, static_cast<uint32_t>(record.height), 4);
  for (const PictureHash hash : record.hashes) AddLittle(data, hash, 8);
  const bool digest = record.digest.size() == 2 * kDigestBytes;
  for (size_t i = 0; i < kDigestBytes; ++i) {
    const int byte =
        digest ? Nibble(record.digest[2 * i]) << 4 | Nibble(record.digest[2 * i + 1]) : 0;
    data.push_back(static_cast<char>(byte));
  }
  const bool sharpness = record.sharpness >= 0;
  AddLittle(data,
            (record.hasHashes ? kHasHashes : 0) | (digest ? kHasDigest : 0) |
                (sharpness ? kHasSharpness : 0) | (record.severalPages ? kSeveralPages : 0) |
                kKnowsPages,
            4);
  AddLittle(data, sharpness ? std::bit_cast<uint32_t>(record.sharpness) : 0, 4);
  return data;
}

std::string DigestText(std::span<const uint8_t> bytes) {
  constexpr const char* kDigits = "0123456789abcdef";
  std::string text;
  for (const uint8_t byte : bytes) {
    text += kDigits[byte >> 4];
    text += kDigits[byte & 15];
  }
  return text;
}

}  // namespace

HashStore::HashStore(std::string path) : store_(std::move(path), kLayout) {}

std::optional<HashRecord> HashStore::Find(const std::string& path, uint64_t size,
                                          int64_t modified) const {
  const StoredRecord* const stored = store_.Find(path, size, modified);
  if (stored == nullptr) return std::nullopt;
  HashRecord record{.size = size, .modified = modified};
  ByteReader reader({reinterpret_cast<const uint8_t*>(stored->data.data()), stored->data.size()});
  record.width = static_cast<int32_t>(reader.Le32());
  record.height = static_cast<int32_t>(reader.Le32());
  for (PictureHash& hash : record.hashes) hash = reader.Le64();
  const auto digest = reader.Take(kDigestBytes);
  const uint32_t flags = reader.Le32();
  if ((flags & kKnowsPages) == 0) return std::nullopt;
  record.severalPages = (flags & kSeveralPages) != 0;
  record.hasHashes = (flags & kHasHashes) != 0;
  if ((flags & kHasDigest) != 0) record.digest = DigestText(digest);
  if ((flags & kHasSharpness) != 0) record.sharpness = std::bit_cast<float>(reader.Le32());
  return record;
}

void HashStore::Put(const std::string& path, const HashRecord& record) {
  store_.Put(path, {.size = record.size, .modified = record.modified, .data = DataOf(record)});
}

}  // namespace fotomill
