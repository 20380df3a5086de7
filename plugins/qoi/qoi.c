/*
 * QOI, the "Quite OK Image Format", read and written. A small, complete plug-in, meant to be read:
 * docs/user/plugins.md explains the functions that it exports.
 *
 *   offset size  field, big-endian
 *        0    4  "qoif"
 *        4    4  width
 *        8    4  height
 *       12    1  channels, 3 or 4; only informative
 *       13    1  color space, 0 or 1; only informative
 *       14       chunks, then seven bytes 0 and one byte 1
 *
 * A chunk describes one pixel, or a run of them, from the previous pixel and a table of 64 pixels
 * seen before:
 *
 *   0xFE r g b      red, green, blue; the alpha of the previous pixel
 *   0xFF r g b a    all four
 *   00xxxxxx        pixel number x of the table
 *   01rrggbb        small differences to the previous pixel, each -2 to 1
 *   10gggggg rrrrbbbb  difference of green, -32 to 31, and those of red and blue to it, -8 to 7
 *   11xxxxxx        x + 1 times the previous pixel, 1 to 62 times
 *
 * Source: The Quite OK Image Format, specification version 1.0 (2022).
 */
#include "fotomill_plugin_kit.h"

#define HEAD_SIZE 14
#define LONGEST_RUN 62
/* A chunk of one byte stands for 62 pixels at most. */
#define MOST_PIXELS_PER_BYTE 62

typedef struct Pixel {
  uint8_t r, g, b, a;
} Pixel;

typedef struct Header {
  uint32_t width, height;
  int channels;
} Header;

static const uint8_t endMark[8] = {0, 0, 0, 0, 0, 0, 0, 1};

static uint32_t PlaceInTable(Pixel p) { return (p.r * 3u + p.g * 5u + p.b * 7u + p.a * 11u) % 64; }

static int IsSame(Pixel a, Pixel b) { return a.r == b.r && a.g == b.g && a.b == b.b && a.a == b.a; }

/* ---- reading ---- */

static int32_t ParseHeader(const FmwFile* file, Header* header) {
  if (file->size < HEAD_SIZE) return FMW_ERROR_READ;
  if (memcmp(file->bytes, "qoif", 4) != 0) return FMW_ERROR_DAMAGED;
  header->width = FmwGetBe(file->bytes + 4, 4);
  header->height = FmwGetBe(file->bytes + 8, 4);
  header->channels = file->bytes[12];
  if (header->width < 1 || header->height < 1 || header->width > INT32_MAX ||
      header->height > INT32_MAX || (header->channels != 3 && header->channels != 4))
    return FMW_ERROR_DAMAGED;
  return 0;
}

/* What the decoder carries from pixel to pixel. */
typedef struct Decoder {
  const uint8_t* next;
  const uint8_t* end;
  Pixel table[64];
  Pixel pixel;
  int run; /* pixels that repeat the last one */
} Decoder;

/* Decodes the next pixel; 0 if the chunks have ended. */
static int NextPixel(Decoder* decoder) {
  Pixel* const p = &decoder->pixel;
  const size_t left = (size_t)(decoder->end - decoder->next);
  const uint8_t* const c = decoder->next;
  if (decoder->run > 0) {
    --decoder->run;
    return 1;
  }
  if (left < 1) return 0;
  if (c[0] == 0xff || c[0] == 0xfe) {
    const size_t size = c[0] == 0xff ? 5 : 4;
    if (left < size) return 0;
    p->r = c[1];
    p->g = c[2];
    p->b = c[3];
    if (size == 5) p->a = c[4];
    decoder->next += size;
  } else if (c[0] >> 6 == 0) {
    *p = decoder->table[c[0]];
    decoder->next += 1;
  } else if (c[0] >> 6 == 1) {
    p->r = (uint8_t)(p->r + (c[0] >> 4 & 3) - 2);
    p->g = (uint8_t)(p->g + (c[0] >> 2 & 3) - 2);
    p->b = (uint8_t)(p->b + (c[0] & 3) - 2);
    decoder->next += 1;
  } else if (c[0] >> 6 == 2) {
    const int green = (c[0] & 63) - 32;
    if (left < 2) return 0;
    p->r = (uint8_t)(p->r + green + (c[1] >> 4) - 8);
    p->g = (uint8_t)(p->g + green);
    p->b = (uint8_t)(p->b + green + (c[1] & 15) - 8);
    decoder->next += 2;
  } else {
    decoder->run = c[0] & 63;
    decoder->next += 1;
  }
  decoder->table[PlaceInTable(*p)] = *p;
  return 1;
}

static int DecodeRow(Decoder* decoder, const FmwBitmap* bitmap, uint32_t y) {
  uint8_t* row = FmwRow(bitmap, y);
  for (uint32_t x = 0; x < bitmap->width; ++x) {
    if (!NextPixel(decoder)) return 0;
    *row++ = decoder->pixel.b;
    *row++ = decoder->pixel.g;
    *row++ = decoder->pixel.r;
    if (bitmap->bits == 32) *row++ = decoder->pixel.a;
  }
  return 1;
}

static int32_t Decode(const FmwFile* file, const FMW_READ_REQUEST* request,
                      const FMW_HOST_SERVICES* services, FmwBitmap* bitmap) {
  Header header;
  Decoder decoder = {
      file->bytes + HEAD_SIZE, file->bytes + file->size, {{0, 0, 0, 0}}, {0, 0, 0, 255}, 0};
  int32_t error = ParseHeader(file, &header);
  if (error != 0) return error;
  if ((uint64_t)header.width * header.height > (uint64_t)file->size * MOST_PIXELS_PER_BYTE)
    return FMW_ERROR_READ;
  *bitmap = FmwNewBitmap(header.width, header.height, header.channels == 4 ? 32 : 24, request);
  if (bitmap->block == 0) return FMW_ERROR_MEMORY;
  for (uint32_t y = 0; y < header.height && error == 0; ++y) {
    if (!DecodeRow(&decoder, bitmap, y)) error = FMW_ERROR_READ;
    if (y % 64 == 0) services->progressStep((int32_t)y, (int32_t)header.height);
  }
  if (error != 0) FmwFreeBitmap(bitmap, request);
  return error;
}

/* ---- writing ---- */

/* What the encoder carries from pixel to pixel. */
typedef struct Encoder {
  uint8_t* next; /* there is room for the longest chunk of each pixel */
  Pixel table[64];
  Pixel before;
  int run;
} Encoder;

static void EndRun(Encoder* encoder) {
  if (encoder->run > 0) *encoder->next++ = (uint8_t)(0xc0 | (encoder->run - 1));
  encoder->run = 0;
}

/* The chunk of a pixel with the alpha of the one before. */
static void PutColor(Encoder* encoder, Pixel p) {
  const int red = (int8_t)(p.r - encoder->before.r), green = (int8_t)(p.g - encoder->before.g),
            blue = (int8_t)(p.b - encoder->before.b);
  const int redToGreen = red - green, blueToGreen = blue - green;
  if (red >= -2 && red <= 1 && green >= -2 && green <= 1 && blue >= -2 && blue <= 1) {
    *encoder->next++ = (uint8_t)(0x40 | (red + 2) << 4 | (green + 2) << 2 | (blue + 2));
  } else if (green >= -32 && green <= 31 && redToGreen >= -8 && redToGreen <= 7 &&
             blueToGreen >= -8 && blueToGreen <= 7) {
    *encoder->next++ = (uint8_t)(0x80 | (green + 32));
    *encoder->next++ = (uint8_t)((redToGreen + 8) << 4 | (blueToGreen + 8));
  } else {
    const uint8_t chunk[4] = {0xfe, p.r, p.g, p.b};
    memcpy(encoder->next, chunk, sizeof chunk);
    encoder->next += sizeof chunk;
  }
}

static void PutPixel(Encoder* encoder, Pixel p) {
  const uint32_t place = PlaceInTable(p);
  if (IsSame(p, encoder->before)) {
    if (++encoder->run == LONGEST_RUN) EndRun(encoder);
    return;
  }
  EndRun(encoder);
  if (IsSame(encoder->table[place], p)) {
    *encoder->next++ = (uint8_t)place;
  } else if (p.a == encoder->before.a) {
    PutColor(encoder, p);
  } else {
    const uint8_t chunk[5] = {0xff, p.r, p.g, p.b, p.a};
    memcpy(encoder->next, chunk, sizeof chunk);
    encoder->next += sizeof chunk;
  }
  encoder->table[place] = p;
  encoder->before = p;
}

static void PutHeader(const FmwBitmap* bitmap, int channels, Encoder* encoder) {
  uint8_t* head = encoder->next;
  memcpy(head, "qoif", 4);
  for (int i = 0; i < 4; ++i) {
    head[4 + i] = (uint8_t)(bitmap->width >> (24 - 8 * i));
    head[8 + i] = (uint8_t)(bitmap->height >> (24 - 8 * i));
  }
  head[12] = (uint8_t)channels;
  head[13] = 0; /* sRGB */
  encoder->next += HEAD_SIZE;
}

static int32_t Encode(const char* fileName, const FmwBitmap* bitmap,
                      const FMW_HOST_SERVICES* services) {
  const int channels = bitmap->bits == 32 ? 4 : 3;
  const size_t longest = (size_t)channels + 1; /* chunk of one pixel */
  const size_t rowSize = (size_t)channels * bitmap->width;
  uint8_t* const pixels = malloc(rowSize);
  uint8_t* const out =
      malloc(HEAD_SIZE + longest * bitmap->width * bitmap->height + sizeof endMark + 1);
  Encoder encoder = {out, {{0, 0, 0, 0}}, {0, 0, 0, 255}, 0};
  int32_t error = FMW_ERROR_MEMORY;
  if (pixels != 0 && out != 0) {
    PutHeader(bitmap, channels, &encoder);
    for (uint32_t y = 0; y < bitmap->height; ++y) {
      FmwGivenRow(bitmap, y, channels == 4, pixels);
      for (size_t i = 0; i < rowSize; i += (size_t)channels) {
        const Pixel p = {pixels[i], pixels[i + 1], pixels[i + 2],
                         channels == 4 ? pixels[i + 3] : 255};
        PutPixel(&encoder, p);
      }
      if (y % 64 == 0) services->progressStep((int32_t)y, (int32_t)bitmap->height);
    }
    EndRun(&encoder);
    memcpy(encoder.next, endMark, sizeof endMark);
    encoder.next += sizeof endMark;
    error = FmwWriteFile(fileName, out, (size_t)(encoder.next - out));
  }
  free(pixels);
  free(out);
  return error;
}

/* ---- exports ---- */

FMW_EXPORT const char* FMW_CALL PLUGIN11GetVersion(void) { return "1.0"; }

FMW_EXPORT int32_t FMW_CALL PLUGIN11GetPluginParams(FMW_PLUGIN_PARAMS* params, int32_t zero) {
  (void)zero;
  if (params->version < FMW_PLUGIN_VERSION) return 0;
  strcpy(params->textA, "QOI");
  strcpy(params->extensions, "qoi");
  strcpy(params->textB, "Quite OK Image");
  params->flags1 = 24;
  params->flags2 = FMW_FORMAT_BITMAP | FMW_FORMAT_ALPHA;
  return 1;
}

FMW_EXPORT int32_t FMW_CALL PLUGIN11GetInfo(FMW_PICTURE_INFO* info, const char* fileName,
                                            int32_t* error, const FMW_HOST_SERVICES* services) {
  FmwFile file;
  Header header;
  (void)services;
  *error = FmwReadFile(fileName, HEAD_SIZE, &file);
  if (*error != 0) return 0;
  *error = ParseHeader(&file, &header);
  free(file.bytes);
  if (*error != 0) return 0;
  info->width = (int32_t)header.width;
  info->height = (int32_t)header.height;
  info->bitsPerPixel = header.channels == 4 ? 32 : 24;
  strcpy(info->typeName, "QOI");
  return 1;
}

FMW_EXPORT FMW_HANDLE FMW_CALL PLUGIN12ReadImage(const char* fileName,
                                                 const FMW_READ_REQUEST* request, int32_t* error,
                                                 const FMW_HOST_SERVICES* services) {
  FmwFile file;
  FmwBitmap bitmap = {0, 0, 0, 0, 0, 0};
  *error = FmwReadFile(fileName, UINT64_MAX, &file);
  if (*error != 0) return 0;
  *error = Decode(&file, request, services, &bitmap);
  free(file.bytes);
  return *error == 0 ? bitmap.block : 0;
}

/* Older programs call this one. */
FMW_EXPORT FMW_HANDLE FMW_CALL PLUGIN11ReadImage(const char* fileName, int32_t* error,
                                                 const FMW_HOST_SERVICES* services) {
  return PLUGIN12ReadImage(fileName, 0, error, services);
}

FMW_EXPORT int32_t FMW_CALL PLUGIN11WriteImage(const char* fileName, FMW_HANDLE bitmap,
                                               const char* comment, int32_t* error,
                                               const FMW_HOST_SERVICES* services) {
  const FmwBitmap given = FmwGivenBitmap(bitmap);
  (void)comment; /* there is no place for one */
  *error = Encode(fileName, &given, services);
  return *error == 0;
}
