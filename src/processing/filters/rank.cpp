#include "processing/filters/rank.h"

#include <algorithm>
#include <cstring>
#include <vector>

#include "platform/vector.h"
#include "processing/filters/median_kernel.h"
#include "processing/promote.h"

namespace fotomill {

namespace {

// columns whose histograms fit in the processor's cache
constexpr int32_t kMedianTile = 128;
constexpr int32_t kExtremeTile = 1024;
constexpr int32_t kLeastRows = 64;     // per band: its first row costs as much as the window height

size_t Channels(const PackedImage& image) { return image.Bits() == 24 ? 3 : 1; }

// Columns left to right - 1 of a band of rows.
struct Tile {
  int32_t left, right, first, end;
};

// Histograms of the columns below a row of windows in one tile, for all channels. Source: S.
// Perreault and P. Hebert, "Median Filtering in Constant Time", IEEE Transactions on Image
// Processing 16 (2007).
class ColumnHistograms {
 public:
  ColumnHistograms(const PackedImage& source, int32_t radius)
      : source_(source), radius_(radius), channels_(Channels(source)) {}

  Status Open(const Tile& tile) {
    samples_.clear();
    for (int32_t x = tile.left - radius_; x < tile.right + radius_; ++x) {
      const auto column = static_cast<size_t>(std::clamp(x, 0, source_.Width() - 1));
      for (size_t c = 0; c < channels_; ++c)
        samples_.push_back(static_cast<uint32_t>(column * channels_ + c));
    }
    groupStride_ = samples_.size() * kCountsInGroup;
    if (!counts_.Allocate((kCountsInGroup + 1) * groupStride_ * sizeof(uint16_t)))
      return Status::MemoryAllocationError;
    for (int32_t y = tile.first - radius_; y <= tile.first + radius_; ++y) Count(Row(y), 1);
    return Status::Ok;
  }

  // Advances from row y - 1 to row y.
  void MoveTo(int32_t y) {
    const uint8_t *gone = Row(y - radius_ - 1), *come = Row(y + radius_);
    if (gone == come) return;
    uint16_t *groups = Groups(), *levels = Levels();
    for (size_t n = 0; n < samples_.size(); ++n) {
      const uint8_t old = gone[samples_[n]], fresh = come[samples_[n]];
      const size_t place = n * kCountsInGroup;
      --groups[place + old / kCountsInGroup];
      ++groups[place + fresh / kCountsInGroup];
      --levels[old / kCountsInGroup * groupStride_ + place + old % kCountsInGroup];
      ++levels[fresh / kCountsInGroup * groupStride_ + place + fresh % kCountsInGroup];
    }
  }

  ColumnCounts Of(size_t channel) {
    const size_t place = channel * kCountsInGroup;
    return {Groups() + place, Levels() + place, channels_ * kCountsInGroup, groupStride_};
  }

 private:
  const uint8_t* Row(int32_t y) const {
    return source_.Row(std::clamp(y, 0, source_.Height() - 1)).data();
  }
  uint16_t* Groups() { return counts_.Items<uint16_t>().data(); }
  uint16_t* Levels() { return Groups() + groupStride_; }

  void Count(const uint8_t* row, uint16_t times) {
    for (size_t n = 0; n < samples_.size(); ++n) {
      const uint8_t level = row[samples_[n]];
      const size_t place = n * kCountsInGroup;
      Groups()[place + level / kCountsInGroup] += times;
      Levels()[level / kCountsInGroup * groupStride_ + place + level % kCountsInGroup] += times;
    }
  }

  const PackedImage& source_;
  const int32_t radius_;
  const size_t channels_;
  // offset in a row of each column of the tile, including `radius` columns on either side
  std::vector<uint32_t> samples_;
  size_t groupStride_ = 0;
  platform::MemoryBlock counts_;  // groups, then levels group by group
};

Status MedianTile(const PackedImage& source, int32_t radius, const Tile& tile,
                  PackedImage& target) {
  const size_t channels = Channels(source);
  const MedianRow medians = MedianRowHere();
  ColumnHistograms histograms(source, radius);
  RETURN_IF_BAD(histograms.Open(tile));
  for (int32_t y = tile.first; y < tile.end; ++y) {
    if (y > tile.first) histograms.MoveTo(y);
    uint8_t* row = target.Row(y).data() + static_cast<size_t>(tile.left) * channels;
    for (size_t c = 0; c < channels; ++c) {
      medians(histograms.Of(c), 2 * radius + 1, tile.right - tile.left, row + c, channels);
    }
  }
  return Status::Ok;
}

struct Least {
  static uint8_t Of(uint8_t a, uint8_t b) { return std::min(a, b); }
};
struct Greatest {
  static uint8_t Of(uint8_t a, uint8_t b) { return std::max(a, b); }
};

// Replaces each sample by the extreme of itself and the next `window` - 1 samples, `step` apart.
// All of these must exist for `count` samples. Combines the results of adjacent windows, doubling
// the window each time.
template <typename Extreme>
void ExtremesAhead(uint8_t* samples, size_t count, size_t window, size_t step) {
  const auto combine = [&](size_t away, size_t needed) {
    VECTOR_READS_AHEAD
    for (size_t i = 0; i < count + needed * step; ++i)
      samples[i] = Extreme::Of(samples[i], samples[i + away * step]);
  };
  size_t have = 1;
  for (; 2 * have <= window; have *= 2) combine(have, window - 2 * have);
  if (have < window) combine(window - have, 0);
}

template <typename Extreme>
Status ExtremeTile(const PackedImage& source, int32_t radius, const Tile& tile,
                   PackedImage& target) {
  const size_t channels = Channels(source), window = 2 * static_cast<size_t>(radius) + 1;
  const auto columns = static_cast<size_t>(tile.right - tile.left),
             rows = static_cast<size_t>(tile.end - tile.first);
  const size_t wide = columns * channels, stride = (columns + window - 1) * channels;
  platform::MemoryBlock room;
  if (!room.Allocate(stride * (rows + window - 1), platform::Fill::Unset))
    return Status::MemoryAllocationError;
  for (size_t r = 0; r < rows + window - 1; ++r) {
    const int32_t y =
        std::clamp(tile.first - radius + static_cast<int32_t>(r), 0, source.Height() - 1);
    const uint8_t* from = source.Row(y).data();
    uint8_t* row = room.Data() + r * stride;
    for (size_t i = 0; i < stride / channels; ++i) {
      const int32_t x =
          std::clamp(tile.left - radius + static_cast<int32_t>(i), 0, source.Width() - 1);
      std::memcpy(row + i * channels, from + static_cast<size_t>(x) * channels, channels);
    }
    ExtremesAhead<Extreme>(row, wide, window, channels);
  }
  ExtremesAhead<Extreme>(room.Data(), rows * stride, window, stride);
  for (size_t r = 0; r < rows; ++r) {
    uint8_t* row = target.Row(tile.first + static_cast<int32_t>(r)).data() +
                   static_cast<size_t>(tile.left) * channels;
    std::memcpy(row, room.Data() + r * stride, wide);
  }
  return Status::Ok;
}

// Filters a 24-bit image or an alpha plane into a new one.
Status RankImage(const PackedImage& source, Rank rank, int32_t radius, const Work& work,
                 PackedImage& target) {
  const auto rankTile = rank == Rank::Median    ? MedianTile
                        : rank == Rank::Minimum ? ExtremeTile<Least>
                                                : ExtremeTile<Greatest>;
  const int32_t wide = std::max(rank == Rank::Median ? kMedianTile : kExtremeTile, 4 * radius);
  return ForBands(
      source.Height(), std::max(kLeastRows, 4 * radius), work, [&](int32_t first, int32_t end) {
        for (int32_t left = 0; left < source.Width(); left += wide) {
          if (!work.GoesOn()) return Status::FunctionCancelled;
          RETURN_IF_BAD(rankTile(
              source, radius, {left, std::min(left + wide, source.Width()), first, end}, target));
        }
        return Status::Ok;
      });
}

// Multiplies colors by alpha, or divides them by it.
template <bool divide>
void WeighColors(PackedImage& image, const PackedImage& alpha) {
  for (int32_t y = 0; y < image.Height(); ++y) {
    uint8_t* color = image.Row(y).data();
    const uint8_t* opacity = alpha.Row(y).data();
    for (int32_t x = 0; x < image.Width(); ++x, ++opacity) {
      const uint32_t a = *opacity;
      for (int c = 0; c < 3; ++c, ++color) {
        const uint32_t value = *color;
        if constexpr (divide) {
          *color =
              a == 0 ? uint8_t{0} : static_cast<uint8_t>(std::min(255u, (value * 255 + a / 2) / a));
        } else {
          *color = static_cast<uint8_t>((value * a + 127) / 255);
        }
      }
    }
  }
}

Status CopyImage(const PackedImage& image, PackedImage& copy) {
  RETURN_IF_BAD(NewPackedImage(image.Width(), image.Height(), nullptr, 24, copy, platform::Fill::Unset));
  std::ranges::copy(image.Rows(), copy.Rows().begin());
  return Status::Ok;
}

}  // namespace

Status RankPicture(PictureRecord& picture, Rank rank, int32_t radius, const Work& work) {
  if (picture.image.Empty()) return Status::EmptyImage;
  RETURN_IF_BAD(PromotePicture(picture));
  if (radius == 0) return Status::Ok;
  const int32_t width = picture.image.Width(), height = picture.image.Height();
  PackedImage image, alpha;
  RETURN_IF_BAD(NewPackedImage(width, height, nullptr, 24, image));
  if (picture.alpha.Empty()) {
    RETURN_IF_BAD(RankImage(picture.image, rank, radius, work, image));
  } else {
    PackedImage weighed;
    RETURN_IF_BAD(CopyImage(picture.image, weighed));
    WeighColors<false>(weighed, picture.alpha);
    RETURN_IF_BAD(NewAlphaPlane(width, height, alpha));
    RETURN_IF_BAD(RankImage(weighed, rank, radius, work, image));
    RETURN_IF_BAD(RankImage(picture.alpha, rank, radius, work, alpha));
    WeighColors<true>(image, alpha);
    picture.alpha = std::move(alpha);
  }
  picture.image = std::move(image);
  return Status::Ok;
}

}  // namespace fotomill
