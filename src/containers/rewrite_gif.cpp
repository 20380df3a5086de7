#include <algorithm>
#include <optional>

#include "containers/bare_file.h"
#include "containers/gif_walk.h"
#include "containers/metadata_rewrite.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr size_t kVersion = 4;  // offset of "7a" or "9a"

// The first XMP extension, and where to put a new one: behind other applications, as some programs
// expect the one for repetitions first.
struct XmpPlace {
  std::optional<GifBlock> block;
  uint64_t at = 0;  // of the block, or for a new one
};

Status FindPlace(std::span<const uint8_t> file, XmpPlace& place) {
  GifWalk walk(file);
  place.at = walk.Position();
  bool applications = true;
  for (GifBlock block; walk.Next(block);) {
    if (place.block) continue;
    applications = applications && block.label == kGifApplicationLabel;
    if (block.application == kGifXmp) {
      place.block = block;
      place.at = walk.Position() - block.whole.size();
    } else if (applications) {
      place.at = walk.Position();
    }
  }
  return walk.Outcome();
}

bool IsKept(const GifBlock& block, const BareOptions& options) {
  if (block.kind == GifBlock::Kind::Image) return true;
  if (IsGifPictureExtension(block.label, block.application)) return true;
  return block.label == kGifCommentLabel ? options.texts
                                         : options.profile && block.application == kGifProfile;
}

}  // namespace

Status FindGifMetadata(std::span<const uint8_t> file, MetadataViews& views) {
  views = {};
  XmpPlace place;
  RETURN_IF_BAD(FindPlace(file, place));
  if (!place.block) return Status::Ok;
  views.xmp = GifXmpPacket(*place.block);
  return views.xmp.empty() ? Status::DamagedFile : Status::Ok;
}

Status RewriteGif(std::span<const uint8_t> file, const MetadataBlocks& blocks, FilePieces& made,
                  std::string& reason) {
  made.Clear();
  XmpPlace place;
  RETURN_IF_BAD(FindPlace(file, place));
  if (!blocks.xmp || (blocks.xmp->empty() && !place.block)) {
    made.Keep(file);
    return Status::Ok;
  }
  if (place.block && GifXmpPacket(*place.block).empty()) {
    reason = Tr("Its XMP is damaged.");
    return Status::UnsuitableImage;
  }
  if (std::ranges::find(*blocks.xmp, uint8_t{0}) != blocks.xmp->end()) {
    reason = Tr("The format has no place for this XMP.");
    return Status::UnsuitableImage;
  }
  // older files have no extensions
  std::vector<uint8_t> head(file.begin(), file.begin() + static_cast<ptrdiff_t>(place.at));
  if (!blocks.xmp->empty()) head[kVersion] = '9';
  made.Add(std::move(head));
  if (!blocks.xmp->empty()) made.Add(MakeGifXmp(*blocks.xmp));
  made.Keep(file.subspan(place.at + (place.block ? place.block->whole.size() : 0)));
  return Status::Ok;
}

Status MakeBareGif(std::span<const uint8_t> file, const BareOptions& options,
                   std::vector<uint8_t>& bare) {
  GifWalk walk(file);
  bare.assign(file.begin(), file.begin() + static_cast<ptrdiff_t>(
                                               std::min<uint64_t>(walk.Position(), file.size())));
  for (GifBlock block; walk.Next(block);) {
    if (IsKept(block, options)) bare.insert(bare.end(), block.whole.begin(), block.whole.end());
  }
  RETURN_IF_BAD(walk.Outcome());
  bare.push_back(file[walk.Position()]);
  return Status::Ok;
}

}  // namespace fotomill
