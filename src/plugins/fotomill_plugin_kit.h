/*
 * Helpers for plug-ins: packed bitmaps and memory blocks. Optional; fotomill_plugin.h alone is the
 * interface. Plain C, also usable from C++. Everything is inline, so a module links nothing.
 */
#ifndef FOTOMILL_PLUGIN_KIT_H
#define FOTOMILL_PLUGIN_KIT_H

#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "fotomill_plugin.h"

/* Limits that modules check before they allocate memory: pixels of a picture, bytes of a file. */
#define FMW_KIT_MOST_PIXELS 350000000u
#define FMW_KIT_MOST_BYTES ((uint64_t)1 << 31)

static inline void FmwPutLe(uint8_t* bytes, uint32_t value, int count) {
  for (int i = 0; i < count; ++i) bytes[i] = (uint8_t)(value >> (8 * i));
}
static inline uint32_t FmwGetLe(const uint8_t* bytes, int count) {
  uint32_t value = 0;
  for (int i = 0; i < count; ++i) value |= (uint32_t)bytes[i] << (8 * i);
  return value;
}
static inline uint32_t FmwGetBe(const uint8_t* bytes, int count) {
  uint32_t value = 0;
  for (int i = 0; i < count; ++i) value = value << 8 | bytes[i];
  return value;
}

/* Bytes of a row, padded to a multiple of 4. */
static inline size_t FmwStride(uint32_t width, int bits) {
  return ((size_t)width * (size_t)bits + 31) / 32 * 4;
}

/* A packed bitmap. */
typedef struct FmwBitmap {
  uint8_t* block; /* what is returned to the program; 0 if there was not enough memory */
  uint8_t* rows;  /* the first row of `block`, the top one if it is top-down */
  size_t stride;  /* bytes per row */
  uint32_t width, height;
  int bits;
} FmwBitmap;

/* A new top-down bitmap of 8 (gray), 24 or 32 bits with undefined rows, from the program's memory
 * if there is a request, else from malloc(). On failure `block` is 0. */
static inline FmwBitmap FmwNewBitmap(uint32_t width, uint32_t height, int bits,
                                     const FMW_READ_REQUEST* request) {
  FmwBitmap bitmap = {0, 0, FmwStride(width, bits), width, height, bits};
  const uint32_t colors = bits > 8 ? 0 : 1u << bits;
  const uint64_t size = 40 + 4 * (uint64_t)colors + (uint64_t)bitmap.stride * height;
  if (width < 1 || height < 1 || (uint64_t)width * height > FMW_KIT_MOST_PIXELS) return bitmap;
  bitmap.block =
      (uint8_t*)(request != 0 && request->allocate != 0 ? request->allocate(size) : malloc(size));
  if (bitmap.block == 0) return bitmap;
  memset(bitmap.block, 0, 40);
  FmwPutLe(bitmap.block, 40, 4);
  FmwPutLe(bitmap.block + 4, width, 4);
  FmwPutLe(bitmap.block + 8, 0u - height, 4); /* negative: top row first */
  FmwPutLe(bitmap.block + 12, 1, 2);
  FmwPutLe(bitmap.block + 14, (uint32_t)bits, 2);
  FmwPutLe(bitmap.block + 20, (uint32_t)(bitmap.stride * height), 4);
  FmwPutLe(bitmap.block + 32, colors, 4);
  FmwPutLe(bitmap.block + 36, colors, 4);
  for (uint32_t i = 0; i < colors; ++i)
    FmwPutLe(bitmap.block + 40 + 4 * i, 0x010101u * (i * 255 / (colors - 1)), 4);
  bitmap.rows = bitmap.block + 40 + 4 * colors;
  return bitmap;
}

/* Gives a bitmap back that is not returned after all. */
static inline void FmwFreeBitmap(FmwBitmap* bitmap, const FMW_READ_REQUEST* request) {
  if (bitmap->block != 0) {
    if (request != 0 && request->release != 0) {
      request->release(bitmap->block);
    } else {
      free(bitmap->block);
    }
  }
  bitmap->block = bitmap->rows = 0;
}

/* Row y of a bitmap that FmwNewBitmap made, from the top. */
static inline uint8_t* FmwRow(const FmwBitmap* bitmap, uint32_t y) {
  return bitmap->rows + bitmap->stride * y;
}

/* Views a bitmap that the program passes to a writer. */
static inline FmwBitmap FmwGivenBitmap(FMW_HANDLE handle) {
  FmwBitmap bitmap = {(uint8_t*)handle, 0, 0, 0, 0, 0};
  bitmap.width = FmwGetLe(bitmap.block + 4, 4);
  bitmap.height = FmwGetLe(bitmap.block + 8, 4);
  bitmap.bits = (int)FmwGetLe(bitmap.block + 14, 2);
  bitmap.stride = FmwStride(bitmap.width, bitmap.bits);
  bitmap.rows = bitmap.block + 40 + (bitmap.bits > 8 ? 0 : 4u << bitmap.bits);
  return bitmap;
}

/* Converts row y from the top of a given bitmap to red, green, blue, and with `alpha` a fourth byte
 * of opacity, 255 for pictures without alpha. */
static inline void FmwGivenRow(const FmwBitmap* bitmap, uint32_t y, int alpha, uint8_t* pixels) {
  const uint8_t* row = bitmap->rows + bitmap->stride * (bitmap->height - 1 - y);
  const uint8_t* table = bitmap->block + 40;
  const int bytes = bitmap->bits / 8;
  for (uint32_t x = 0; x < bitmap->width; ++x) {
    const uint8_t* color = bitmap->bits > 8 ? row + (size_t)bytes * x : 0;
    if (color == 0) {
      const size_t bit = (size_t)x * (size_t)bitmap->bits;
      const uint32_t index = (uint32_t)row[bit / 8] >> (8 - (size_t)bitmap->bits - bit % 8) &
                             ((1u << bitmap->bits) - 1);
      color = table + 4 * index;
    }
    *pixels++ = color[2];
    *pixels++ = color[1];
    *pixels++ = color[0];
    if (alpha) *pixels++ = bitmap->bits == 32 ? color[3] : 255;
  }
}

/* Whether a given bitmap of up to 8 bits has only grays in its color table. */
static inline int FmwIsGray(const FmwBitmap* bitmap) {
  if (bitmap->bits > 8) return 0;
  for (size_t i = 0; i < (size_t)1 << bitmap->bits; ++i) {
    const uint8_t* color = bitmap->block + 40 + 4 * i;
    if (color[0] != color[1] || color[1] != color[2]) return 0;
  }
  return 1;
}

/* Copies red, green, blue (and alpha) pixels into a row of a bitmap of 24 (32) bits. */
static inline void FmwPutRgbRow(const FmwBitmap* bitmap, uint32_t y, const uint8_t* pixels) {
  uint8_t* row = FmwRow(bitmap, y);
  const size_t bytes = (size_t)bitmap->bits / 8;
  for (uint32_t x = 0; x < bitmap->width; ++x, row += bytes, pixels += bytes) {
    row[0] = pixels[2];
    row[1] = pixels[1];
    row[2] = pixels[0];
    if (bytes == 4) row[3] = pixels[3];
  }
}

/* A block for FMW_METADATA with a copy of `bytes`; empty if there are none or no memory. */
static inline FMW_BLOCK FmwBlock(const void* bytes, size_t size) {
  FMW_BLOCK block = {0, 0};
  if (size == 0 || bytes == 0) return block;
  block.data = malloc(size);
  if (block.data == 0) return block;
  memcpy(block.data, bytes, size);
  block.size = size;
  return block;
}

/* A whole file. */
typedef struct FmwFile {
  uint8_t* bytes; /* owned by the caller, free() */
  size_t size;
} FmwFile;

/* Reads a whole file, or its first `most` bytes. 0, or an error number. */
static inline int32_t FmwReadFile(const char* fileName, uint64_t most, FmwFile* whole) {
  FILE* file = fopen(fileName, "rb");
  int32_t error = file == 0 ? FMW_ERROR_OPEN : 0;
  long size = 0;
  whole->bytes = 0;
  whole->size = 0;
  if (file == 0) return error;
  if (fseek(file, 0, SEEK_END) != 0 || (size = ftell(file)) < 0 || fseek(file, 0, SEEK_SET) != 0)
    error = FMW_ERROR_READ;
  if (error == 0) {
    if ((uint64_t)size > FMW_KIT_MOST_BYTES && most > FMW_KIT_MOST_BYTES) error = FMW_ERROR_MEMORY;
    whole->size = (uint64_t)size < most ? (size_t)size : (size_t)most;
    if (error == 0) whole->bytes = (uint8_t*)malloc(whole->size + 1);
    if (error == 0 && whole->bytes == 0) error = FMW_ERROR_MEMORY;
  }
  if (error == 0 && fread(whole->bytes, 1, whole->size, file) != whole->size)
    error = FMW_ERROR_READ;
  fclose(file);
  if (error != 0) {
    free(whole->bytes);
    whole->bytes = 0;
  }
  return error;
}

/* Writes a whole new file. 0, or an error number. */
static inline int32_t FmwWriteFile(const char* fileName, const void* bytes, size_t size) {
  FILE* file = fopen(fileName, "wb");
  int32_t error = 0;
  if (file == 0) return FMW_ERROR_CREATE;
  if (fwrite(bytes, 1, size, file) != size) error = FMW_ERROR_WRITE;
  if (fclose(file) != 0) error = FMW_ERROR_WRITE;
  return error;
}

/* Finds the orientation's value in the first directory of an EXIF block: its place, or 0 if there
 * is none. `bigEndian` receives the byte order. Source: TIFF 6.0, section 2; Exif 2.32, 4.6.4. */
static inline size_t FmwOrientationPlace(const uint8_t* exif, size_t size, int* bigEndian) {
  if (size < 14) return 0;
  *bigEndian = exif[0] == 'M';
  const uint64_t start = *bigEndian ? FmwGetBe(exif + 4, 4) : FmwGetLe(exif + 4, 4);
  if (start + 2 > size) return 0;
  const uint32_t count = *bigEndian ? FmwGetBe(exif + start, 2) : FmwGetLe(exif + start, 2);
  for (uint32_t i = 0; i < count; ++i) {
    const uint64_t place = start + 2 + 12 * (uint64_t)i;
    if (place + 12 > size) return 0;
    const uint8_t* entry = exif + place;
    if ((*bigEndian ? FmwGetBe(entry, 2) : FmwGetLe(entry, 2)) == 0x112) return (size_t)place + 8;
  }
  return 0;
}

/* Sets the orientation of an EXIF block to 1, upright, after it has been applied to the pixels. */
static inline void FmwSetUpright(uint8_t* exif, size_t size) {
  int bigEndian = 0;
  const size_t place = FmwOrientationPlace(exif, size, &bigEndian);
  if (place != 0) {
    exif[place] = bigEndian ? 0 : 1;
    exif[place + 1] = bigEndian ? 1 : 0;
  }
}

#ifdef __cplusplus
/* A whole file that is freed with the object. */
struct FmwOwnedFile {
  FmwFile file = {nullptr, 0};
  FmwOwnedFile() = default;
  ~FmwOwnedFile() { free(file.bytes); }
  FmwOwnedFile(const FmwOwnedFile&) = delete;
  FmwOwnedFile& operator=(const FmwOwnedFile&) = delete;
};
#endif

#endif
