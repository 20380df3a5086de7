// The layout of Photo CD files (PCD), big-endian, in sectors of 2048 bytes.
//
//   sector  content
//        0  empty; in an overview: "PCD_OPA", and at byte 10 the number of pictures (2 bytes)
//        1  "PCD_IPI", then image information:
//             offset size  field
//                  7    2  version of the specification
//                 13    4  scan time, seconds since 1970
//                 21    1  medium
//                 22   20  product
//                 42   20  scanner manufacturer
//                 62   16  scanner
//                 90   20  its serial number
//                112   20  workstation manufacturer
//                165   60  photo finisher
//               1538    1  bits 0-1: 90-degree rotations to the left, 2-3: sizes beyond 768 x 512
//               1539    2  first sector of 3072 x 2048
//        4  192 x 128   for every two rows: both of luma, one of each chroma, half as wide
//       23  384 x 256   the same
//       96  768 x 512   the same
//      387  at byte 510: last sector of 1536 x 1024, relative to 384 (2 bytes)
//      388  1536 x 1024: code table of the luma deltas
//      389  its deltas, padded to a sector
//        n  3072 x 2048, starts with a sector of FF bytes
//     n+12  code tables of the deltas for luma and both chroma planes
//     n+14  the deltas
//
// An overview has pictures of 192 x 128, one after the other from sector 5 on. For the coding of
// deltas see pcd_deltas.cpp.
//
// The format was never published, and what is known comes from reverse engineering. Therefore the
// sizes in the header are not relied on: a resolution exists if its data are present.
// Sources: H. Danisch, hpcdtoppm (1992); Murray and vanRyper, Encyclopedia of Graphics File Formats
// (1996), on Photo CD; the Photo CD tags of ExifTool's documentation; PRONOM fmt/211.
#include "formats/photocd/pcd_file.h"

#include <algorithm>

#include "core/byte_reader.h"
#include "formats/photocd/pcd_deltas.h"

namespace fotomill {

namespace {

constexpr uint64_t kPlainSectors[kPcdPlainSizes] = {4, 23, 96};
constexpr uint64_t kOverviewSector = 5, kOverviewStep = 18;
constexpr uint64_t kTables4 = 388, kData4 = 389;
constexpr uint64_t kTables16 = 12;        // sectors after the start of the resolution
constexpr uint64_t kNear = 16;            // sectors by which a pointer may be off
constexpr uint64_t kMostSectors4 = 2048;  // for the deltas of 1536 x 1024

std::span<const uint8_t> Sector(std::span<const uint8_t> file, uint64_t number) {
  ByteReader bytes(file);
  bytes.Seek(number * kPcdSector);
  return bytes.Peek(kPcdSector);
}

// Whether a sector has the code tables of `planes` planes.
bool HasTables(std::span<const uint8_t> sector, int32_t planes) {
  PcdCodes codes;
  return codes.Parse(sector, planes);
}

bool Begins16(std::span<const uint8_t> file, uint64_t number) {
  const auto head = Sector(file, number);
  return head.size() == kPcdSector && std::ranges::count(head.first(32), uint8_t{0xFF}) > 30 &&
         HasTables(Sector(file, number + kTables16), 3);
}

// The first of `count` sectors from `from` on where the largest resolution starts; 0 if none does.
uint64_t Find16(std::span<const uint8_t> file, uint64_t from, uint64_t count) {
  for (uint64_t number = std::max(from, kData4); count > 0; ++number, --count) {
    if (Begins16(file, number)) return number;
  }
  return 0;
}

// Both fields for the start of the largest resolution may be empty.
uint64_t Locate16(std::span<const uint8_t> file) {
  ByteReader bytes(file);
  bytes.Seek(kPcdHeader + 1539);
  const uint64_t told = bytes.Be16();
  bytes.Seek(387 * kPcdSector + 510);
  const uint64_t counted = 384 + uint64_t{bytes.Be16()} + 1;
  uint64_t found = told > kData4 ? Find16(file, told - 1, kNear) : 0;
  if (found == 0) found = Find16(file, counted - 1, kNear);
  return found != 0 ? found : Find16(file, kData4, kMostSectors4);
}

}  // namespace

uint64_t PcdFile::Plain(int32_t size, int32_t picture) const {
  if (!overview) return kPlainSectors[size] * kPcdSector;
  return (kOverviewSector + kOverviewStep * static_cast<uint64_t>(picture)) * kPcdSector;
}

Status ParsePcd(std::span<const uint8_t> file, PcdFile& pcd) {
  ByteReader bytes(file);
  pcd.overview = bytes.Match("PCD_OPA");
  if (pcd.overview) {
    bytes.Seek(10);
    const int32_t told = bytes.Be16();
    if (file.size() < kOverviewSector * kPcdSector) return Status::FileReadError;
    const uint64_t there = (file.size() / kPcdSector - kOverviewSector) / kOverviewStep;
    pcd.pictures = static_cast<int32_t>(std::min<uint64_t>(static_cast<uint64_t>(told), there));
    if (told == 0) return Status::NoImages;
    return pcd.pictures == 0 ? Status::FileReadError : Status::Ok;
  }
  bytes.Seek(kPcdHeader);
  if (!bytes.Match("PCD_IPI")) return Status::DamagedFile;
  bytes.Seek(kPcdHeader + 1538);
  pcd.turns = bytes.U8() & 3;
  if (file.size() < pcd.Plain(0, 0) + PcdPlainBytes(0)) return Status::FileReadError;
  while (pcd.largest < kPcdPlainSizes - 1 &&
         file.size() >= pcd.Plain(pcd.largest + 1, 0) + PcdPlainBytes(pcd.largest + 1)) {
    ++pcd.largest;
  }
  if (pcd.largest < kPcdPlainSizes - 1 || !HasTables(Sector(file, kTables4), 1)) return Status::Ok;
  pcd.largest = 3;
  const uint64_t begin = Locate16(file);
  if (begin == 0) return Status::Ok;
  pcd.tables16 = (begin + kTables16) * kPcdSector;
  pcd.largest = 4;
  return Status::Ok;
}

}  // namespace fotomill
