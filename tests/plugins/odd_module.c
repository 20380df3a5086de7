/*
 * A module that misbehaves in one way, chosen by a macro at build time; everything else about it is
 * in order. Its pictures are 2 x 1 of 24 bits, blue and red, whatever the file holds.
 */
#include <signal.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "fotomill_plugin.h"

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
#if defined(ALL_FLAGS)
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
#if defined(EXITS)
  if (strstr(fileName, "last") != 0) exit(0);
#elif defined(CRASHES)
  if (strstr(fileName, "last") != 0) raise(SIGSEGV);
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
#if defined(SMALL_BLOCK)
  block[6] = 1; /* 65538 pixels wide, in 48 bytes */
#elif defined(WRONG_DEPTH)
  block[14] = 7;
#elif defined(EMPTY_RESULT)
  free(block);
  return 0;
#endif
  return block;
}

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
