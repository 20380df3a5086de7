/*
 * PAM, the portable arbitrary map, read and written: grays and colors, with or without alpha.
 *
 *   "P7", then lines "WIDTH n", "HEIGHT n", "DEPTH n", "MAXVAL n", "TUPLTYPE name" in any order,
 *   "#" lines are comments, "ENDHDR" ends the header
 *   rows from the top, DEPTH samples a pixel, two bytes each, high one first, if MAXVAL is above
 * 255
 *
 * Source: pam(5) of netpbm.
 */
#include "fotomill_plugin_exports.h"

#define MOST_HEADER 65536
#define MOST_DEPTH 64

typedef struct Header {
  uint32_t width, height, depth, most;
  size_t start; /* of the samples */
} Header;

/* Whether a line starts with a word; `value` receives the number behind it, 0 if there is none. */
static int IsField(const char* line, const char* word, uint32_t* value) {
  const size_t length = strlen(word);
  uint64_t number = 0;
  if (strncmp(line, word, length) != 0 || (line[length] != ' ' && line[length] != '\t')) return 0;
  for (line += length; *line == ' ' || *line == '\t';) ++line;
  for (; *line >= '0' && *line <= '9' && number <= INT32_MAX; ++line)
    number = number * 10 + (uint64_t)(*line - '0');
  *value = number <= INT32_MAX ? (uint32_t)number : 0;
  return 1;
}

static int IsComplete(const Header* header) {
  return header->width > 0 && header->height > 0 && header->depth > 0 && header->most > 0 &&
         header->depth <= MOST_DEPTH && header->most <= 65535;
}

static int32_t ParseHeader(const FmwFile* file, Header* header) {
  const char* const text = (const char*)file->bytes;
  const size_t size = file->size < MOST_HEADER ? file->size : MOST_HEADER;
  size_t place = 3;
  memset(header, 0, sizeof *header);
  if (size < 3) return FMW_ERROR_READ;
  if (memcmp(text, "P7\n", 3) != 0) return FMW_ERROR_DAMAGED;
  while (place < size) {
    const char* const end = memchr(text + place, '\n', size - place);
    char line[64] = {0};
    size_t length;
    if (end == 0) return FMW_ERROR_READ;
    length = (size_t)(end - text) - place;
    memcpy(line, text + place, length < sizeof line - 1 ? length : sizeof line - 1);
    place += length + 1;
    if (strcmp(line, "ENDHDR") == 0) {
      header->start = place;
      return IsComplete(header) ? 0 : FMW_ERROR_DAMAGED;
    }
    (void)(IsField(line, "WIDTH", &header->width) || IsField(line, "HEIGHT", &header->height) ||
           IsField(line, "DEPTH", &header->depth) || IsField(line, "MAXVAL", &header->most));
  }
  return FMW_ERROR_READ;
}

/* Depths 1 to 4 are gray, gray and alpha, color, color and alpha; of more, the first are colors. */
static int Bits(const Header* header) {
  return header->depth == 1 ? 8 : header->depth == 2 || header->depth == 4 ? 32 : 24;
}

static uint8_t Scaled(const uint8_t* sample, uint32_t most) {
  uint32_t value = most > 255 ? FmwGetBe(sample, 2) : sample[0];
  if (value > most) value = most;
  return (uint8_t)(most == 255 ? value : (value * 255 + most / 2) / most);
}

static void DecodeRow(const uint8_t* samples, const Header* header, int bits, uint8_t* row) {
  static const int places[][4] = {{0}, {0, 0, 0, 1}, {2, 1, 0}, {2, 1, 0, 3}};
  const int* const place = places[header->depth > 4 ? 2 : header->depth - 1];
  const size_t width = header->most > 255 ? 2 : 1;
  for (uint32_t x = 0; x < header->width; ++x, samples += width * header->depth) {
    for (int i = 0; i < bits / 8; ++i)
      *row++ = Scaled(samples + width * (size_t)place[i], header->most);
  }
}

static int32_t Decode(const FmwFile* file, const FMW_READ_REQUEST* request, FmwBitmap* bitmap) {
  Header header;
  const int32_t error = ParseHeader(file, &header);
  size_t rowSize;
  if (error != 0) return error;
  rowSize = (size_t)header.width * header.depth * (header.most > 255 ? 2 : 1);
  if ((file->size - header.start) / rowSize < header.height) return FMW_ERROR_READ;
  *bitmap = FmwNewBitmap(header.width, header.height, Bits(&header), request);
  if (bitmap->block == 0) return FMW_ERROR_MEMORY;
  for (uint32_t y = 0; y < header.height; ++y)
    DecodeRow(file->bytes + header.start + rowSize * y, &header, bitmap->bits, FmwRow(bitmap, y));
  return 0;
}

static int32_t Read(const char* fileName, const FMW_READ_REQUEST* request, FmwBitmap* bitmap) {
  FmwFile file;
  int32_t error = FmwReadFile(fileName, UINT64_MAX, &file);
  if (error != 0) return error;
  error = Decode(&file, request, bitmap);
  free(file.bytes);
  return error;
}

static int32_t ReadHeader(const char* fileName, Header* header) {
  FmwFile file;
  int32_t error = FmwReadFile(fileName, MOST_HEADER, &file);
  if (error != 0) return error;
  error = ParseHeader(&file, header);
  free(file.bytes);
  return error;
}

static int32_t Describe(const char* fileName, FMW_PICTURE_INFO* info) {
  Header header;
  const int32_t error = ReadHeader(fileName, &header);
  if (error != 0) return error;
  info->width = (int32_t)header.width;
  info->height = (int32_t)header.height;
  info->bitsPerPixel = Bits(&header);
  FmwGrayPalette(info);
  strcpy(info->typeName, "Portable arbitrary map");
  return 0;
}

static int32_t ReadMetadata(const char* fileName, const FMW_READ_REQUEST* request,
                            FMW_METADATA* metadata) {
  Header header;
  const int32_t error = ReadHeader(fileName, &header);
  (void)request;
  if (error != 0) return error;
  if (header.most > 255) metadata->lost |= FMW_LOST_DEPTH;
  if (header.depth > 4) metadata->lost |= FMW_LOST_INKS;
  return 0;
}

static int32_t Write(const char* fileName, const FmwBitmap* given,
                     const FMW_WRITE_REQUEST* request) {
  const int gray = FmwIsGray(given), alpha = given->bits == 32;
  const size_t depth = gray ? 1 : alpha ? 4 : 3;
  const size_t rowSize = depth * given->width;
  const char* const kind = gray ? "GRAYSCALE" : alpha ? "RGB_ALPHA" : "RGB";
  char header[128];
  const size_t start = (size_t)snprintf(
      header, sizeof header, "P7\nWIDTH %u\nHEIGHT %u\nDEPTH %u\nMAXVAL 255\nTUPLTYPE %s\nENDHDR\n",
      given->width, given->height, (unsigned)depth, kind);
  uint8_t* const row = malloc((size_t)given->width * 4);
  uint8_t* const out = malloc(start + rowSize * given->height);
  int32_t error = FMW_ERROR_MEMORY;
  (void)request;
  if (row != 0 && out != 0) {
    memcpy(out, header, start);
    for (uint32_t y = 0; y < given->height; ++y) {
      uint8_t* const target = out + start + rowSize * y;
      FmwGivenRow(given, y, alpha, gray ? row : target);
      for (uint32_t x = 0; gray && x < given->width; ++x) target[x] = row[3 * (size_t)x];
    }
    error = FmwWriteFile(fileName, out, start + rowSize * given->height);
  }
  free(row);
  free(out);
  return error;
}

static const FmwModule module = {"Portable arbitrary map",
                                 "pam",
                                 "Portable arbitrary map",
                                 24,
                                 FMW_FORMAT_BITMAP | FMW_FORMAT_ALPHA,
                                 0,
                                 0};

FMW_MODULE(module)
FMW_MODULE_READS(Describe, Read)
FMW_MODULE_METADATA(ReadMetadata)
FMW_MODULE_WRITES(Write)
