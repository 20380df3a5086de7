// Lossless rotation of JPEG pictures, in blocks of 8 x 8 coefficients. With F(v, u) for the
// vertical frequency v and the horizontal frequency u, a transformed block is
//
//   mirrored horizontally:     F(v, u) * (-1)^u
//   mirrored vertically:       F(v, u) * (-1)^v
//   transposed:                F(u, v); likewise the quantization tables and the sampling factors
//
// since odd cosines change sign when mirrored about the block's center and even ones do not. The
// blocks are then moved to their new positions. A partial block at the right or bottom edge must
// stay at that edge; it cannot become the first one. Source: ITU-T T.81 (1992), annex A.3.3.
#include "formats/jpeg/jpeg_turn.h"

#include <array>
#include <cstdlib>
#include <utility>

#include "formats/jpeg/jpeg_library.h"
#include "picture/packed_image.h"
#include "processing/geometry/cut.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr int kCoefficients = DCTSIZE2;

// Source index and sign of each coefficient in a block.
struct BlockTurn {
  explicit BlockTurn(Turn turn) {
    for (int i = 0; i < kCoefficients; ++i) {
      const int v = i / DCTSIZE, u = i % DCTSIZE;
      const int fromV = turn.swap ? u : v, fromU = turn.swap ? v : u;
      from[i] = static_cast<uint8_t>(fromV * DCTSIZE + fromU);
      sign[i] =
          (turn.flipX && fromU % 2 != 0) != (turn.flipY && fromV % 2 != 0) ? JCOEF{-1} : JCOEF{1};
    }
  }
  void Apply(const JCOEF* source, JCOEF* target) const {
    for (int i = 0; i < kCoefficients; ++i)
      target[i] = static_cast<JCOEF>(source[from[i]] * sign[i]);
  }
  std::array<uint8_t, kCoefficients> from;
  std::array<JCOEF, kCoefficients> sign;
};

// The blocks of one component.
struct Plane {
  JDIMENSION left = 0, top = 0;              // in the old picture, where it is cropped
  JDIMENSION fromWidth = 0, fromHeight = 0;  // in the old picture, without trimmed edges
  JDIMENSION width = 0, height = 0;          // in the rotated picture
  int across = 1, down = 1;                  // sampling factors after rotation
  jvirt_barray_ptr from = nullptr, to = nullptr;
};

struct JpegTurner {
  JpegTurner() {
    errors.Set();
    info.err = &errors.base;
  }
  ~JpegTurner() {
    jpeg_destroy_compress(&info);
    std::free(bytes);
  }
  JpegTurner(const JpegTurner&) = delete;
  JpegTurner& operator=(const JpegTurner&) = delete;

  JpegReader reader;
  JpegErrors errors;  // of the writer
  jpeg_compress_struct info = {};
  jpeg_progress_mgr monitor = {};  // of the writer, also canceled by the reader's token
  unsigned char* bytes = nullptr;
  unsigned long size = 0;
  JDIMENSION left = 0, top = 0;      // in the old picture, where it is cropped
  JDIMENSION width = 0, height = 0;  // of the old picture, without trimmed edges
  std::array<Plane, MAX_COMPONENTS> planes;
};

JDIMENSION RoundedUp(JDIMENSION a, JDIMENSION b) { return (a + b - 1) / b; }

// Width in pixels of the smallest unit with whole blocks of every component.
JDIMENSION PieceWidth(const jpeg_decompress_struct& info) {
  return static_cast<JDIMENSION>(info.num_components == 1 ? 1 : info.max_h_samp_factor) * DCTSIZE;
}
JDIMENSION PieceHeight(const jpeg_decompress_struct& info) {
  return static_cast<JDIMENSION>(info.num_components == 1 ? 1 : info.max_v_samp_factor) * DCTSIZE;
}

// Determines how much of the picture can be rotated.
void Measure(JpegTurner& turner, Turn turn, bool trim, TurnedJpeg& turned) {
  const jpeg_decompress_struct& old = turner.reader.info;
  const JDIMENSION pieceWidth = PieceWidth(old), pieceHeight = PieceHeight(old);
  const JDIMENSION restAcross = turn.flipX ? old.image_width % pieceWidth : 0;
  const JDIMENSION restDown = turn.flipY ? old.image_height % pieceHeight : 0;
  turner.width = old.image_width - restAcross;
  turner.height = old.image_height - restDown;
  turned.trimmed = restAcross > 0 || restDown > 0;
  if (turned.trimmed && (!trim || turner.width == 0 || turner.height == 0)) {
    turned.obstacle = TrRecorded("The size is not a multiple of the block size of %1 x %2 pixels.",
                                 pieceWidth, pieceHeight);
  }
  turned.width = static_cast<int32_t>(turn.swap ? turner.height : turner.width);
  turned.height = static_cast<int32_t>(turn.swap ? turner.width : turner.height);
}

// Determines which blocks a cropped picture keeps.
void MeasureCrop(JpegTurner& turner, const Rectangle& area, TurnedJpeg& cropped) {
  const jpeg_decompress_struct& old = turner.reader.info;
  const Rectangle kept = Clipped(area, static_cast<int32_t>(old.image_width),
                                 static_cast<int32_t>(old.image_height));
  const auto pieceWidth = static_cast<int32_t>(PieceWidth(old)),
             pieceHeight = static_cast<int32_t>(PieceHeight(old));
  if (kept.width == 0 || kept.x % pieceWidth != 0 || kept.y % pieceHeight != 0) {
    cropped.obstacle = TrRecorded(
        "The edges do not lie between blocks of %1 x %2 pixels.", pieceWidth, pieceHeight);
  }
  turner.left = static_cast<JDIMENSION>(kept.x);
  turner.top = static_cast<JDIMENSION>(kept.y);
  turner.width = static_cast<JDIMENSION>(kept.width);
  turner.height = static_cast<JDIMENSION>(kept.height);
  cropped.width = kept.width;
  cropped.height = kept.height;
}

// Computes the old and new block positions of each component.
void LayOut(JpegTurner& turner, Turn turn) {
  const jpeg_decompress_struct& old = turner.reader.info;
  for (int i = 0; i < old.num_components; ++i) {
    const jpeg_component_info& component = old.comp_info[i];
    Plane& plane = turner.planes[static_cast<size_t>(i)];
    const auto kept = [](JDIMENSION pixels, int factor, int most) {
      return RoundedUp(pixels * static_cast<JDIMENSION>(factor),
                       static_cast<JDIMENSION>(most) * DCTSIZE);
    };
    plane.fromWidth = kept(turner.width, component.h_samp_factor, old.max_h_samp_factor);
    plane.fromHeight = kept(turner.height, component.v_samp_factor, old.max_v_samp_factor);
    plane.left = kept(turner.left, component.h_samp_factor, old.max_h_samp_factor);
    plane.top = kept(turner.top, component.v_samp_factor, old.max_v_samp_factor);
    plane.width = plane.fromWidth;
    plane.height = plane.fromHeight;
    plane.across = component.h_samp_factor;
    plane.down = component.v_samp_factor;
    if (turn.swap) {
      std::swap(plane.width, plane.height);
      std::swap(plane.across, plane.down);
    }
  }
}

// Reads all coefficients; damaged ones are an obstacle, as a new file would hide the damage.
Status ReadBlocks(JpegTurner& turner, std::span<const uint8_t> file, TurnedJpeg& turned) {
  JpegReader& reader = turner.reader;
  const bool read = Guarded(reader.errors, [&] {
    jvirt_barray_ptr* arrays = jpeg_read_coefficients(&reader.info);
    for (int i = 0; i < reader.info.num_components; ++i)
      turner.planes[static_cast<size_t>(i)].from = arrays[i];
  });
  if (!read) return reader.Failure();
  if (reader.errors.cutShort && reader.errors.endMissing) return Status::FileReadError;
  turned.end = file.size() - reader.info.src->bytes_in_buffer;
  if (reader.errors.base.num_warnings > 0)
    turned.obstacle = TrRecorded("The file is damaged, although it can be shown.");
  return Status::Ok;
}

void SetPictureForm(JpegTurner& turner, Turn turn) {
  jpeg_decompress_struct& old = turner.reader.info;
  jpeg_compress_struct& info = turner.info;
  jpeg_copy_critical_parameters(&old, &info);
  info.image_width = turn.swap ? turner.height : turner.width;
  info.image_height = turn.swap ? turner.width : turner.height;
  // the old file's segments are kept
  info.write_JFIF_header = info.write_Adobe_marker = FALSE;
  info.restart_interval = old.restart_interval;
  info.optimize_coding = TRUE;
  for (int i = 0; i < info.num_components; ++i) {
    info.comp_info[i].h_samp_factor = turner.planes[static_cast<size_t>(i)].across;
    info.comp_info[i].v_samp_factor = turner.planes[static_cast<size_t>(i)].down;
  }
  if (old.progressive_mode) jpeg_simple_progression(&info);
  if (!turn.swap) return;
  for (JQUANT_TBL* table : info.quant_tbl_ptrs) {
    if (table == nullptr) continue;
    for (int v = 0; v < DCTSIZE; ++v) {
      for (int u = 0; u < v; ++u)
        std::swap(table->quantval[v * DCTSIZE + u], table->quantval[u * DCTSIZE + v]);
    }
  }
}

// Zeroed, as the padding rows in the last group of a component are read as well.
void RequestBlocks(JpegTurner& turner) {
  jpeg_compress_struct& info = turner.info;
  const auto common = static_cast<j_common_ptr>(static_cast<void*>(&info));
  for (int i = 0; i < info.num_components; ++i) {
    Plane& plane = turner.planes[static_cast<size_t>(i)];
    const auto across = static_cast<JDIMENSION>(plane.across),
               down = static_cast<JDIMENSION>(plane.down);
    plane.to = info.mem->request_virt_barray(common, JPOOL_IMAGE, TRUE,
                                             RoundedUp(plane.width, across) * across,
                                             RoundedUp(plane.height, down) * down, down);
  }
}

// Moves the transformed blocks to their positions, one row of new blocks at a time.
void TurnBlocks(JpegTurner& turner, const Plane& plane, Turn turn, const BlockTurn& block) {
  const auto old = static_cast<j_common_ptr>(static_cast<void*>(&turner.reader.info));
  const auto made = static_cast<j_common_ptr>(static_cast<void*>(&turner.info));
  const auto fromRow = [&](JDIMENSION row) {
    return *old->mem->access_virt_barray(old, plane.from, row, 1, FALSE);
  };
  const auto toRow = [&](JDIMENSION row) {
    return *made->mem->access_virt_barray(made, plane.to, row, 1, TRUE);
  };
  const auto source = [](bool flip, JDIMENSION place, JDIMENSION count) {
    return flip ? count - 1 - place : place;
  };
  for (JDIMENSION y = 0; y < plane.height && !turner.reader.stop.Asked(); ++y) {
    JBLOCKROW target = toRow(y);
    if (!turn.swap) {
      const JBLOCKROW row = fromRow(plane.top + source(turn.flipY, y, plane.fromHeight));
      for (JDIMENSION x = 0; x < plane.width; ++x)
        block.Apply(row[plane.left + source(turn.flipX, x, plane.fromWidth)], target[x]);
      continue;
    }
    const JDIMENSION column = source(turn.flipX, y, plane.fromWidth);
    for (JDIMENSION x = 0; x < plane.width; ++x)
      block.Apply(fromRow(source(turn.flipY, x, plane.fromHeight))[column], target[x]);
  }
}

void WatchWriting(j_common_ptr common) {
  if (static_cast<const JpegReader*>(common->client_data)->stop.Asked())
    common->err->error_exit(common);
}

Status WriteTurned(JpegTurner& turner, Turn turn) {
  const BlockTurn block(turn);
  const bool written = Guarded(turner.errors, [&] {
    // the writer reads the reader's blocks, so errors go to the writer
    turner.reader.info.err = &turner.errors.base;
    jpeg_create_compress(&turner.info);
    turner.monitor.progress_monitor = WatchWriting;
    turner.info.progress = &turner.monitor;
    turner.info.client_data = &turner.reader;
    jpeg_mem_dest(&turner.info, &turner.bytes, &turner.size);
    SetPictureForm(turner, turn);
    RequestBlocks(turner);
    std::array<jvirt_barray_ptr, MAX_COMPONENTS> arrays = {};
    for (size_t i = 0; i < arrays.size(); ++i) arrays[i] = turner.planes[i].to;
    jpeg_write_coefficients(&turner.info, arrays.data());
    for (int i = 0; i < turner.info.num_components; ++i)
      TurnBlocks(turner, turner.planes[static_cast<size_t>(i)], turn, block);
    jpeg_finish_compress(&turner.info);
  });
  if (turner.reader.stop.Asked()) return Status::FunctionCancelled;
  if (written) return Status::Ok;
  const Status status =
      turner.errors.Meaning(static_cast<j_common_ptr>(static_cast<void*>(&turner.info)));
  return status == Status::MemoryAllocationError ? status : Status::UnsuitableImage;
}

// Rewrites the blocks that were measured.
Status Rewrite(JpegTurner& turner, std::span<const uint8_t> file, Turn turn, TurnedJpeg& turned) {
  LayOut(turner, turn);
  // the old and the new coefficients
  const bool fits = CheckFileMemory(2 * JpegCoefficientBytes(turner.reader, true)) == Status::Ok;
  if (turned.obstacle.empty() && !fits) turned.obstacle = TrRecorded("The picture is too large.");
  if (!turned.obstacle.empty()) return Status::Ok;
  RETURN_IF_BAD(ReadBlocks(turner, file, turned));
  if (!turned.obstacle.empty()) return Status::Ok;
  const Status status = WriteTurned(turner, turn);
  if (status == Status::Ok) turned.file.assign(turner.bytes, turner.bytes + turner.size);
  if (status != Status::UnsuitableImage) return status;
  turned.obstacle = TrRecorded("This kind of JPEG cannot be rewritten losslessly.");
  return Status::Ok;
}

}  // namespace

Status TurnJpeg(std::span<const uint8_t> file, Orientation orientation, bool trim,
                const StopToken& stop, TurnedJpeg& turned) {
  turned = {};
  const Turn turn = TurnOf(orientation);
  JpegTurner turner;
  turner.reader.stop = stop;
  RETURN_IF_BAD(ReadJpegHeader(turner.reader, file));
  Measure(turner, turn, trim, turned);
  return Rewrite(turner, file, turn, turned);
}

Status CropJpeg(std::span<const uint8_t> file, const Rectangle& area, const StopToken& stop,
                TurnedJpeg& cropped) {
  cropped = {};
  JpegTurner turner;
  turner.reader.stop = stop;
  RETURN_IF_BAD(ReadJpegHeader(turner.reader, file));
  MeasureCrop(turner, area, cropped);
  return Rewrite(turner, file, TurnOf(Orientation::Upright), cropped);
}

Status ReadJpegGrid(std::span<const uint8_t> file, JpegGrid& grid) {
  JpegReader reader;
  RETURN_IF_BAD(ReadJpegHeader(reader, file));
  grid.picture = {static_cast<int32_t>(reader.info.image_width),
                  static_cast<int32_t>(reader.info.image_height)};
  grid.block = {static_cast<int32_t>(PieceWidth(reader.info)),
                static_cast<int32_t>(PieceHeight(reader.info))};
  return Status::Ok;
}

}  // namespace fotomill
