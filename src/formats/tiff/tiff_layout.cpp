#include "formats/tiff/tiff_layout.h"

#include <algorithm>
#include <bit>

namespace fotomill {

namespace {

void FindAlpha(TIFF* tiff, TiffLayout& layout) {
  uint16_t count = 0, *kinds = nullptr;
  const bool told = TIFFGetField(tiff, TIFFTAG_EXTRASAMPLES, &count, &kinds) != 0 && count > 0;
  // not marked in old files
  if (!told && layout.photometric == PHOTOMETRIC_RGB && layout.samples == 4) layout.alpha = 3;
  if (!told) return;
  for (uint16_t i = 0; i < count && layout.alpha < 0; ++i) {
    if (kinds[i] != EXTRASAMPLE_ASSOCALPHA && kinds[i] != EXTRASAMPLE_UNASSALPHA) continue;
    layout.alpha = layout.colors + i;
    layout.multiplied = kinds[i] == EXTRASAMPLE_ASSOCALPHA;
  }
  if (layout.alpha >= layout.samples) layout.alpha = -1;
}

uint16_t ColorsOf(TIFF* tiff, const TiffLayout& layout) {
  switch (layout.photometric) {
    case PHOTOMETRIC_RGB: return 3;
    case PHOTOMETRIC_YCBCR: return layout.compression == COMPRESSION_JPEG ? 3 : 0;
    case PHOTOMETRIC_SEPARATED:
      return TiffField<uint16_t>(tiff, TIFFTAG_INKSET) == INKSET_CMYK ? 4 : 0;
    case PHOTOMETRIC_CIELAB:
    case PHOTOMETRIC_ICCLAB:
      return layout.samples >= 3 && (layout.form.bits == 8 || layout.form.bits == 16) ? 3 : 0;
    case PHOTOMETRIC_MINISBLACK:
    case PHOTOMETRIC_MINISWHITE:
    case PHOTOMETRIC_PALETTE: return 1;
    default: return 0;  // left to the library
  }
}

void ChooseRows(TiffLayout& layout) {
  const bool indexed = layout.photometric == PHOTOMETRIC_PALETTE;
  const uint32_t bits = layout.form.bits;
  const bool small = bits <= 8 && layout.form.kind == TiffSampleForm::Unsigned;
  if (layout.colors == 0 || layout.colors > layout.samples || !CanConvert(layout.form) ||
      (indexed && !small))
    return;
  if (layout.colors == 1 && layout.alpha < 0 && layout.samples == 1 && small &&
      std::has_single_bit(bits)) {
    layout.rows = bits == 2 ? TiffRows::Nibbles : TiffRows::Direct;
    layout.bitsPerPixel = static_cast<int32_t>(bits);
  } else if (layout.colors == 1 && layout.alpha < 0) {
    layout.rows = TiffRows::Gray;
    layout.bitsPerPixel = 8;
  } else {
    layout.rows = TiffRows::Colors;
  }
}

}  // namespace

Status ReadTiffLayout(TIFF* tiff, TiffLayout& layout) {
  layout.width = TiffField<uint32_t>(tiff, TIFFTAG_IMAGEWIDTH);
  layout.height = TiffField<uint32_t>(tiff, TIFFTAG_IMAGELENGTH);
  if (layout.width < 1 || layout.height < 1 || layout.width > INT32_MAX ||
      layout.height > INT32_MAX)
    return Status::DamagedFile;
  layout.form.bits = TiffField<uint16_t>(tiff, TIFFTAG_BITSPERSAMPLE);
  layout.samples = TiffField<uint16_t>(tiff, TIFFTAG_SAMPLESPERPIXEL);
  layout.compression = TiffField<uint16_t>(tiff, TIFFTAG_COMPRESSION);
  const uint16_t format = TiffField<uint16_t>(tiff, TIFFTAG_SAMPLEFORMAT);
  layout.form.kind = format == SAMPLEFORMAT_IEEEFP ? TiffSampleForm::Float
                     : format == SAMPLEFORMAT_INT  ? TiffSampleForm::Signed
                                                   : TiffSampleForm::Unsigned;
  // missing in old fax files
  if (TIFFGetField(tiff, TIFFTAG_PHOTOMETRIC, &layout.photometric) == 0) {
    layout.photometric = layout.samples >= 3 ? PHOTOMETRIC_RGB : PHOTOMETRIC_MINISWHITE;
  }
  if (layout.samples < 1 || layout.form.bits < 1) return Status::DamagedFile;
  layout.separate = layout.samples > 1 &&
                    TiffField<uint16_t>(tiff, TIFFTAG_PLANARCONFIG) == PLANARCONFIG_SEPARATE;
  layout.tiled = TIFFIsTiled(tiff) != 0;
  layout.tileWidth = layout.tiled ? TiffField<uint32_t>(tiff, TIFFTAG_TILEWIDTH) : layout.width;
  layout.bandHeight =
      TiffField<uint32_t>(tiff, layout.tiled ? TIFFTAG_TILELENGTH : TIFFTAG_ROWSPERSTRIP);
  if (layout.bandHeight < 1 || layout.tileWidth < 1) return Status::DamagedFile;
  if (!layout.tiled) layout.bandHeight = std::min(layout.bandHeight, layout.height);
  layout.colors = ColorsOf(tiff, layout);
  if (layout.colors > 0) FindAlpha(tiff, layout);
  ChooseRows(layout);
  if (layout.compression == COMPRESSION_JPEG)
    TIFFSetField(tiff, TIFFTAG_JPEGCOLORMODE, JPEGCOLORMODE_RGB);
  return Status::Ok;
}

}  // namespace fotomill
