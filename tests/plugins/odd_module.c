/*
 * A module that misbehaves in one way, chosen by a macro at build time; everything else about it is
 * in order. Its pictures are 2 x 1 of 24 bits, blue and red, whatever the file holds.
 */
#include <signal.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <unistd.h>

#include "fotomill_plugin.h"

#if defined(GUEST_EXITS) || defined(GUEST_CRASHES)
#define IN_PROGRAM
#endif

FMW_EXPORT int32_t FMW_CALL PLUGIN11GetPluginParams(FMW_PLUGIN_PARAMS* params, int32_t zero) {
  (void)zero;
#if defined(REFUSES)
  return 0;
#endif
  strcpy(params->textA, "Odd");
  strcpy(params->textB, "of tests");
  strcpy(params->extensions, "odd");
  params->flags1 = 24;
  params->flags2 = FMW_FORMAT_BITMAP;
#if defined(IN_PROGRAM)
  params->flags2 |= FMW_FORMAT_IN_PROGRAM;
#elif defined(METADATA)
  params->flags2 |= FMW_FORMAT_MULTI | FMW_FORMAT_FRAMES | FMW_FORMAT_EXIF | FMW_FORMAT_ICC;
#elif defined(ALL_FLAGS)
  params->flags1 = params->flags2 = 0xffffffff;
#elif defined(GAPS_IN_LIST)
  strcpy(params->extensions, "abc;;def");
  params->flags2 |= FMW_FORMAT_MULTI;
#elif defined(FORTY_FORMATS)
  params->extensions[0] = 0;
  for (int i = 0; i < 40; ++i) {
    const char name[] = {'f', (char)('a' + i / 10), (char)('0' + i % 10), ';', 0};
    strcat(params->extensions, name);
  }
#elif defined(UNTERMINATED_TEXTS)
  memset(params->textA, 'A', sizeof params->textA);
  memset(params->textB, 'B', sizeof params->textB);
  memset(params->extensions + 3, ';', sizeof params->extensions - 3);
#endif
  return 1;
}

#if !defined(NO_INFO_EXPORT)
FMW_EXPORT int32_t FMW_CALL PLUGIN11GetInfo(FMW_PICTURE_INFO* info, const char* fileName,
                                            int32_t* error, const FMW_HOST_SERVICES* services) {
  (void)fileName;
  info->width = 2;
  info->height = 1;
  info->bitsPerPixel = 24;
  memset(info->typeName, 'T', sizeof info->typeName);
#if defined(GARBAGE_SIZES)
  info->width = -2147483647;
  info->bitsPerPixel = 999;
#elif defined(ODD_DEPTH)
  info->bitsPerPixel = 12;
#elif defined(OLDER)
  info->version -= 1; /* typeName is not filled */
  info->background = 0x7f102030;
  info->width = 3; /* one more than there is */
#elif defined(ERROR_NUMBER)
  *error = 25;
  return 0;
#elif defined(ERROR_42)
  *error = 42;
  return 0;
#elif defined(BLIND_WRITER)
  FILE* file = fopen(fileName, "rb");
  const int bad = fgetc(file) != 'o';
  fclose(file);
  *error = FMW_ERROR_DAMAGED;
  if (bad) return 0;
#endif
  (void)error;
  return services->size == (int32_t)sizeof *services && memcmp(services->mark, "RXaR", 4) == 0 &&
         strcmp(services->configuration[0].name, "AllowDestinationOverrides") == 0;
}
#endif

FMW_EXPORT FMW_HANDLE FMW_CALL PLUGIN11ReadImage(const char* fileName, int32_t* error,
                                                 const FMW_HOST_SERVICES* services) {
  static const uint8_t rowBytes[] = {255, 0, 0, 0, 0, 255, 0, 0};
  uint8_t* block = calloc(1, 48);
#if defined(EXITS) || defined(GUEST_EXITS)
  if (strstr(fileName, "last") != 0) exit(0);
#elif defined(CRASHES) || defined(GUEST_CRASHES)
  if (strstr(fileName, "last") != 0) raise(SIGSEGV);
#elif defined(HANGS)
  while (strstr(fileName, "last") != 0) pause();
#elif defined(SPINS)
  for (volatile int spun = 0; strstr(fileName, "last") != 0;) ++spun;
#elif defined(EATS)
  for (void* meal = block; strstr(fileName, "last") != 0;) {
    meal = malloc(100000000);
    memset(meal, 1, 100000000);
  }
#elif defined(LARGER)
  free(block);
  block = calloc(1, 40 + 900 * 900 * 4);
#endif
  (void)fileName;
  (void)error;
  (void)services;
#if defined(LOADS_ANOTHER)
  if (strstr(fileName, "inner") == 0) {
    char inner[300];
    snprintf(inner, sizeof inner, "%.*sinner.odd", (int)(strrchr(fileName, '/') + 1 - fileName),
             fileName);
    services->freePicture(services->loadPicture(inner, error));
    services->progressStep(1, 2);
  }
#endif
  block[0] = 40;
  block[4] = 2;
  block[8] = 1;
  block[12] = 1;
  block[14] = 24;
  memcpy(block + 40, rowBytes, 8);
#if defined(LARGER) /* 900 x 900, and not 2 x 1 as said */
  block[4] = block[8] = 900 & 255;
  block[5] = block[9] = 900 >> 8;
#elif defined(SMALL_BLOCK)
  block[6] = 1; /* 65538 pixels wide, in 48 bytes */
#elif defined(WRONG_DEPTH)
  block[14] = 7;
#elif defined(EMPTY_RESULT)
  free(block);
  return 0;
#endif
  return block;
}

#if defined(METADATA)
static const FMW_OPTION options[] = {
    {"Level", "Level, 1 to 9", FMW_OPTION_NUMBER, 1, 9, 5, 0},
    {"Kind", "Kind", FMW_OPTION_CHOICE, 0, 0, 7, "small;large"},
};
FMW_EXPORT const FMW_OPTION* FMW_CALL PLUGIN12GetOptions(int32_t* count) {
  *count = 2;
  return options;
}
FMW_EXPORT const char* FMW_CALL PLUGIN12GetLibraries(void) { return "libodd\t1.2\tMIT"; }

static FMW_BLOCK Block(const char* text, uint64_t claimed) {
  FMW_BLOCK block = {strdup(text), claimed};
  return block;
}

/* Three frames; the profile is said to be larger than it is. */
FMW_EXPORT int32_t FMW_CALL PLUGIN12GetMetadata(FMW_METADATA* metadata, const char* fileName,
                                                const FMW_READ_REQUEST* request, int32_t* error,
                                                const FMW_HOST_SERVICES* services) {
  const int32_t delays[] = {100, -5, 300};
  (void)fileName;
  (void)error;
  (void)services;
  metadata->pages = 3;
  metadata->rounds = 2;
  metadata->lost = FMW_LOST_DEPTH | 0x80;
  metadata->exif = Block("exif", 4);
  metadata->xmp = Block("xmp", 3);
  metadata->icc = Block("icc", 1000000000000);
  metadata->delays.data = malloc(sizeof delays);
  memcpy(metadata->delays.data, delays, sizeof delays);
  metadata->delays.size = sizeof delays;
  return request->size == (int32_t)sizeof *request;
}

/* One pixel: page, wanted side and first option. */
FMW_EXPORT FMW_HANDLE FMW_CALL PLUGIN12ReadImage(const char* fileName,
                                                 const FMW_READ_REQUEST* request, int32_t* error,
                                                 const FMW_HOST_SERVICES* services) {
  uint8_t* block = request->allocate(44);
  (void)fileName;
  (void)error;
  (void)services;
  memset(block, 0, 44);
  block[0] = 40;
  block[4] = block[8] = block[12] = 1;
  block[14] = 24;
  block[40] = (uint8_t)request->page;
  block[41] = (uint8_t)request->wantedSide;
  block[42] = (uint8_t)request->options[0];
  return block;
}

/* Writes what it was given as text. */
FMW_EXPORT int32_t FMW_CALL PLUGIN12WriteImage(const char* fileName, FMW_HANDLE bitmap,
                                               const FMW_WRITE_REQUEST* request, int32_t* error,
                                               const FMW_HOST_SERVICES* services) {
  FILE* file = fopen(fileName, "wb");
  (void)bitmap;
  (void)error;
  (void)services;
  if (file == 0) return 0;
  fprintf(file, "quality %d lossless %d options %d %d exif %.*s xmp %.*s icc %.*s comment %s",
          request->quality, request->lossless, request->options[0], request->options[1],
          (int)request->exif.size, (const char*)request->exif.data, (int)request->xmp.size,
          (const char*)request->xmp.data, (int)request->icc.size, (const char*)request->icc.data,
          request->comment == 0 ? "none" : request->comment);
  fclose(file);
  return 1;
}

FMW_EXPORT int32_t FMW_CALL PLUGIN12Transcode(const char* source, const char* destination,
                                              int32_t* error, const FMW_HOST_SERVICES* services) {
  FILE* file = fopen(destination, "wb");
  (void)services;
  if (file == 0) return 0;
  fprintf(file, "from %s", strrchr(source, '/') + 1);
  fclose(file);
  *error = FMW_ERROR_FORMAT;
  return strstr(source, "good") != 0;
}
#endif

#if defined(EXITS_AT_ONCE)
__attribute__((constructor)) static void Leave(void) { exit(0); }
#endif

#if defined(COMMENTS)
FMW_EXPORT FMW_HANDLE FMW_CALL PLUGIN11GetComment(const char* fileName, int32_t* error,
                                                  int32_t zero) {
  (void)fileName;
  (void)error;
  (void)zero;
  return strdup("said by the module");
}
#endif

#if defined(LAZY_WRITER) || defined(EMPTY_WRITER) || defined(NAME_WRITER) || \
    defined(BLIND_WRITER) || defined(ALL_FLAGS)
/* Reports success, whatever it has written. */
FMW_EXPORT int32_t FMW_CALL PLUGIN11WriteImage(const char* fileName, FMW_HANDLE bitmap,
                                               const char* comment, int32_t* error,
                                               const FMW_HOST_SERVICES* services) {
  (void)fileName;
  (void)bitmap;
  (void)comment;
  (void)error;
  (void)services;
#if !defined(LAZY_WRITER)
  FILE* file = fopen(fileName, "wbx"); /* there must be no such file */
  if (file == 0) return 0;
#if defined(NAME_WRITER)
  fputs(strrchr(fileName, '/') + 1, file);
#elif defined(BLIND_WRITER)
  fputs("no such picture", file);
#endif
  fclose(file);
#endif
  return 1;
}
#endif

#if defined(HALF_WRITER) || defined(SILENT_WRITER)
FMW_EXPORT int32_t FMW_CALL PLUGIN11WriteImage(const char* fileName, FMW_HANDLE bitmap,
                                               const char* comment, int32_t* error,
                                               const FMW_HOST_SERVICES* services) {
  FILE* file = fopen(fileName, "wb");
  (void)bitmap;
  (void)comment;
  (void)services;
  fputs("half", file);
  fclose(file);
#if defined(HALF_WRITER)
  *error = 10;
#endif
  (void)error;
  return 0;
}
#endif
