/*
 * A complete image plug-in: the portable anymap formats PBM, PGM and PPM, plain and raw, with their
 * comment.
 *
 * A file is a text header followed by samples, top row first:
 *
 *   "P1" plain bitmap  "P2" plain graymap  "P3" plain pixmap
 *   "P4" raw bitmap    "P5" raw graymap    "P6" raw pixmap
 *   width and height, then (not for bitmaps) the largest sample value, all in decimal, separated by
 * white space;
 *   "#" starts a comment that ends with its line; one white-space character stands before raw
 * samples.
 *
 * In bitmaps 1 is black. Samples of more than 8 bits take two bytes, high byte first, and are
 * reduced to 8 here. Source: the netpbm format pages pbm(5), pgm(5) and ppm(5).
 */
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "fotomill_plugin.h"

#define MOST_PIXELS 300000000u
#define COMMENT_SIZE 4096

/* ---- reading ---- */

typedef struct Header {
  int kind; /* 1 to 6, the digit behind the P */
  uint32_t width, height, most;
  char comment[COMMENT_SIZE];
  size_t commentLength;
} Header;

static int IsSpace(int c) {
  return c == ' ' || c == '\t' || c == '\n' || c == '\r' || c == '\v' || c == '\f';
}

/* Skips white space and comments; the comments' text is kept while there is room. Returns the next
 * character. */
static int NextCharacter(FILE* file, Header* header) {
  int c = getc(file);
  while (IsSpace(c) || c == '#') {
    if (c == '#') {
      c = getc(file);
      if (c == ' ') c = getc(file);
      while (c != '\n' && c != EOF) {
        if (header->commentLength + 2 < COMMENT_SIZE)
          header->comment[header->commentLength++] = (char)c;
        c = getc(file);
      }
      if (header->commentLength + 2 < COMMENT_SIZE) header->comment[header->commentLength++] = '\n';
    } else {
      c = getc(file);
    }
  }
  return c;
}

/* A decimal number and the one character behind it; 0 when there is none or it is too large. */
static int ReadNumber(FILE* file, Header* header, uint32_t* number) {
  int c = NextCharacter(file, header);
  uint32_t value = 0;
  if (c < '0' || c > '9') return 0;
  for (; c >= '0' && c <= '9'; c = getc(file)) {
    if (value > 100000000u) return 0;
    value = value * 10 + (uint32_t)(c - '0');
  }
  *number = value;
  return 1;
}

static int ReadHeader(FILE* file, Header* header) {
  memset(header, 0, sizeof *header);
  if (getc(file) != 'P') return FMW_ERROR_DAMAGED;
  header->kind = getc(file) - '0';
  if (header->kind < 1 || header->kind > 6) return FMW_ERROR_FORMAT;
  header->most = 1;
  if (!ReadNumber(file, header, &header->width) || !ReadNumber(file, header, &header->height))
    return FMW_ERROR_DAMAGED;
  if (header->kind != 1 && header->kind != 4 && !ReadNumber(file, header, &header->most))
    return FMW_ERROR_DAMAGED;
  if (header->width < 1 || header->height < 1 || header->most < 1 || header->most > 65535)
    return FMW_ERROR_DAMAGED;
  if ((uint64_t)header->width * header->height > MOST_PIXELS) return FMW_ERROR_MEMORY;
  while (header->commentLength > 0 && header->comment[header->commentLength - 1] == '\n')
    --header->commentLength;
  header->comment[header->commentLength] = 0;
  return 0;
}

static int Bits(const Header* header) {
  static const int bits[] = {1, 8, 24};
  return bits[(header->kind - 1) % 3];
}

static size_t Stride(uint32_t width, int bits) {
  return ((size_t)width * (size_t)bits + 31) / 32 * 4;
}

/* One sample, scaled to 0..255 (bitmaps: 0 or 1); -1 at the file's end. */
static int ReadSample(FILE* file, Header* header) {
  uint32_t value = 0;
  if (header->kind == 1) {
    const int c = NextCharacter(file, header);
    return c == '0' || c == '1' ? c - '0' : -1;
  }
  if (header->kind <= 3) {
    if (!ReadNumber(file, header, &value)) return -1;
  } else {
    const int high = getc(file);
    const int low = header->most > 255 ? getc(file) : 0;
    if (high == EOF || low == EOF) return -1;
    value = header->most > 255 ? (uint32_t)high << 8 | (uint32_t)low : (uint32_t)high;
  }
  if (value > header->most) value = header->most;
  return header->most == 255 ? (int)value : (int)((value * 255 + header->most / 2) / header->most);
}

static int ReadRow(FILE* file, Header* header, uint8_t* row) {
  const uint32_t width = header->width;
  uint32_t x;
  if (header->kind == 4) { /* packed bits, 1 is black */
    const size_t bytes = (width + 7) / 8;
    if (fread(row, 1, bytes, file) != bytes) return 0;
    for (x = 0; x < bytes; ++x) row[x] = (uint8_t)~row[x];
    return 1;
  }
  for (x = 0; x < width; ++x) {
    if (Bits(header) == 24) {
      const int red = ReadSample(file, header), green = ReadSample(file, header),
                blue = ReadSample(file, header);
      if (red < 0 || green < 0 || blue < 0) return 0;
      row[3 * x] = (uint8_t)blue;
      row[3 * x + 1] = (uint8_t)green;
      row[3 * x + 2] = (uint8_t)red;
    } else {
      const int sample = ReadSample(file, header);
      if (sample < 0) return 0;
      if (header->kind == 1) {
        if (sample == 0) row[x / 8] |= (uint8_t)(0x80 >> x % 8);
      } else {
        row[x] = (uint8_t)sample;
      }
    }
  }
  return 1;
}

static void PutLe(uint8_t* bytes, uint32_t value, int count) {
  int i;
  for (i = 0; i < count; ++i) bytes[i] = (uint8_t)(value >> (8 * i));
}

/* A zeroed packed bitmap with its header and gray color table; `rows` receives where the rows
 * begin. */
static uint8_t* NewBitmap(uint32_t width, uint32_t height, int bits, uint8_t** rows) {
  const uint32_t colors = bits == 24 ? 0 : 1u << bits;
  const size_t rowBytes = Stride(width, bits) * height;
  uint8_t* block = calloc(1, 40 + 4 * colors + rowBytes);
  uint32_t i;
  if (block == NULL) return NULL;
  PutLe(block, 40, 4);
  PutLe(block + 4, width, 4);
  PutLe(block + 8, height, 4);
  PutLe(block + 12, 1, 2);
  PutLe(block + 14, (uint32_t)bits, 2);
  PutLe(block + 20, (uint32_t)rowBytes, 4);
  PutLe(block + 32, colors, 4);
  PutLe(block + 36, colors, 4);
  for (i = 0; i < colors; ++i) memset(block + 40 + 4 * i, (int)(i * 255 / (colors - 1)), 3);
  *rows = block + 40 + 4 * colors;
  return block;
}

static int OpenPicture(const char* fileName, FILE** file, Header* header) {
  int error;
  *file = fopen(fileName, "rb");
  if (*file == NULL) return FMW_ERROR_OPEN;
  error = ReadHeader(*file, header);
  if (error != 0) fclose(*file);
  return error;
}

/* ---- writing ---- */

static uint32_t Le32(const uint8_t* bytes) {
  return bytes[0] | (uint32_t)bytes[1] << 8 | (uint32_t)bytes[2] << 16 | (uint32_t)bytes[3] << 24;
}

static void WriteComment(FILE* file, const char* comment) {
  int lineStart = 1;
  if (comment == NULL || *comment == 0) return;
  for (; *comment != 0; ++comment) {
    if (lineStart) fputs("# ", file);
    lineStart = *comment == '\n';
    putc(*comment, file);
  }
  if (!lineStart) putc('\n', file);
}

/* The kind of file that an extension asks for: 4 bitmap, 5 graymap, 6 pixmap; "pnm" takes what fits
 * the depth. */
static int KindFor(const char* fileName, int bits) {
  const char* dot = strrchr(fileName, '.');
  const char middle = dot != NULL && dot[1] != 0 ? (char)(dot[2] | 0x20) : 'n';
  if (middle == 'b') return 4;
  if (middle == 'g') return 5;
  if (middle == 'p') return 6;
  return bits == 1 ? 4 : bits == 24 ? 6 : 5;
}

/* The color of column x as blue, green, red. */
static const uint8_t* ColorAt(const uint8_t* row, const uint8_t* table, int bits, uint32_t x) {
  if (bits == 24) return row + 3 * (size_t)x;
  if (bits == 8) return table + 4 * row[x];
  if (bits == 4) return table + 4 * (row[x / 2] >> (x % 2 == 0 ? 4 : 0) & 15);
  return table + 4 * (row[x / 8] >> (7 - x % 8) & 1);
}

static int GrayOf(const uint8_t* color) {
  return (color[2] * 299 + color[1] * 587 + color[0] * 114 + 500) / 1000;
}

/* Converts a row to samples of the file, which fit into `out`: 3 bytes a pixel at most. Returns
 * their number. */
static size_t PackRow(const uint8_t* row, const uint8_t* table, int bits, int kind, uint32_t width,
                      uint8_t* out) {
  uint8_t* next = out;
  uint32_t x;
  for (x = 0; x < width; ++x) {
    const uint8_t* color = ColorAt(row, table, bits, x);
    if (kind == 6) {
      *next++ = color[2];
      *next++ = color[1];
      *next++ = color[0];
    } else if (kind == 5) {
      *next++ = (uint8_t)GrayOf(color);
    } else {
      if (x % 8 == 0) *next++ = 0;
      if (GrayOf(color) < 128) next[-1] |= (uint8_t)(0x80 >> x % 8);
    }
  }
  return (size_t)(next - out);
}

/* ---- exports ---- */

FMW_EXPORT const char* FMW_CALL PLUGIN11GetVersion(void) { return "1.0"; }
FMW_EXPORT const char* FMW_CALL PLUGIN11GetCopyright(void) {
  return "A sample of Fotomill Professional";
}

FMW_EXPORT int32_t FMW_CALL PLUGIN11GetPluginParams(FMW_PLUGIN_PARAMS* params, int32_t zero) {
  (void)zero;
  if (params->version < FMW_PLUGIN_VERSION) return 0;
  strcpy(params->textA, "Portable anymap");
  strcpy(params->extensions, "pgm;ppm;pbm;pnm");
  strcpy(params->textB, "Portable anymap");
  params->flags1 = 24;
  params->flags2 = FMW_FORMAT_BITMAP;
  return 1;
}

FMW_EXPORT int32_t FMW_CALL PLUGIN11GetInfo(FMW_PICTURE_INFO* info, const char* fileName,
                                            int32_t* error, const FMW_HOST_SERVICES* services) {
  static const char* const names[] = {"Portable bitmap", "Portable graymap", "Portable pixmap"};
  FILE* file;
  Header header;
  int i;
  (void)services;
  *error = OpenPicture(fileName, &file, &header);
  if (*error != 0) return 0;
  fclose(file);
  info->width = (int32_t)header.width;
  info->height = (int32_t)header.height;
  info->bitsPerPixel = Bits(&header);
  for (i = 0; i < 256; ++i)
    memset(info->palette + 3 * i, info->bitsPerPixel == 1 ? (i == 1 ? 255 : 0) : i, 3);
  strcpy(info->typeName, names[(header.kind - 1) % 3]);
  return 1;
}

FMW_EXPORT FMW_HANDLE FMW_CALL PLUGIN11ReadImage(const char* fileName, int32_t* error,
                                                 const FMW_HOST_SERVICES* services) {
  FILE* file;
  Header header;
  uint8_t* rows = NULL;
  uint8_t* block;
  uint32_t y;
  *error = OpenPicture(fileName, &file, &header);
  if (*error != 0) return NULL;
  block = NewBitmap(header.width, header.height, Bits(&header), &rows);
  if (block == NULL) *error = FMW_ERROR_MEMORY;
  services->progressBegin();
  for (y = 0; y < header.height && *error == 0; ++y) {
    if (!ReadRow(file, &header,
                 rows + Stride(header.width, Bits(&header)) * (header.height - 1 - y))) {
      *error = FMW_ERROR_READ;
    }
    services->progressStep((int32_t)y, (int32_t)header.height);
  }
  services->progressEnd();
  fclose(file);
  if (*error == 0) return block;
  free(block);
  return NULL;
}

FMW_EXPORT int32_t FMW_CALL PLUGIN11WriteImage(const char* fileName, FMW_HANDLE bitmap,
                                               const char* comment, int32_t* error,
                                               const FMW_HOST_SERVICES* services) {
  const uint8_t* block = bitmap;
  const uint32_t width = Le32(block + 4), height = Le32(block + 8);
  const int bits = block[14];
  const uint8_t* table = block + 40;
  const uint8_t* rows = table + (bits == 24 ? 0 : 4u << bits);
  const int kind = KindFor(fileName, bits);
  FILE* file;
  uint8_t* out;
  uint32_t y;
  if (bits > 24) {
    *error = FMW_ERROR_COLORS;
    return 0;
  }
  out = malloc(3 * (size_t)width);
  file = out == NULL ? NULL : fopen(fileName, "wb");
  if (file == NULL) {
    *error = out == NULL ? FMW_ERROR_MEMORY : FMW_ERROR_CREATE;
    free(out);
    return 0;
  }
  fprintf(file, "P%d\n", kind);
  WriteComment(file, comment);
  fprintf(file, kind == 4 ? "%u %u\n" : "%u %u\n255\n", width, height);
  services->progressBegin();
  for (y = 0; y < height; ++y) {
    const uint8_t* row = rows + Stride(width, bits) * (height - 1 - y);
    fwrite(out, 1, PackRow(row, table, bits, kind, width, out), file);
    services->progressStep((int32_t)y, (int32_t)height);
  }
  services->progressEnd();
  if (ferror(file)) *error = FMW_ERROR_WRITE;
  if (fclose(file) != 0) *error = FMW_ERROR_WRITE;
  free(out);
  return *error == 0;
}

FMW_EXPORT FMW_HANDLE FMW_CALL PLUGIN11GetComment(const char* fileName, int32_t* error,
                                                  int32_t zero) {
  FILE* file;
  Header header;
  char* text;
  (void)zero;
  *error = OpenPicture(fileName, &file, &header);
  if (*error != 0) return NULL;
  fclose(file);
  if (header.commentLength == 0) return NULL;
  text = malloc(header.commentLength + 1);
  if (text == NULL) {
    *error = FMW_ERROR_MEMORY;
  } else {
    memcpy(text, header.comment, header.commentLength + 1);
  }
  return text;
}
