/*
 * Writing an image plug-in for Fotomill Professional.
 *
 * A plug-in is a shared library named FMWPL*.so (FMWPL*.DLL on Windows) in the folder "plugin"
 * beside the program. It serves one or more picture formats, one per file extension. This header is
 * all it needs; it is plain C and includes nothing of the program. docs/user/plugins.md walks
 * through a complete example.
 *
 * The program looks up eight functions by name. Three are required: PLUGIN11GetPluginParams,
 * PLUGIN11GetInfo and PLUGIN11ReadImage. The others may be absent.
 *
 * Rules for every call:
 *  - Every block begins with its own size and the interface version. The program sets both; refuse
 * a version that is lower than FMW_PLUGIN_VERSION, ignore bytes beyond the size that you know.
 *  - Blocks are packed: no padding anywhere. Where pointers have 8 bytes the pointer fields are 8
 * bytes wide, and the fields behind them move up by as much; the size field tells which layout it
 * is.
 *  - Texts are UTF-8 and end in a zero byte. File names are as the system gives them.
 *  - Calls into one module never overlap, but they may come from different threads.
 *  - A plug-in is code inside the program: when it crashes, the program does. Check what files
 * claim.
 */
#ifndef FOTOMILL_PLUGIN_H
#define FOTOMILL_PLUGIN_H

#include <stdint.h>

#if defined(_WIN32) && !defined(_WIN64)
#define FMW_CALL __stdcall
#else
#define FMW_CALL
#endif

#if defined(_WIN32)
#define FMW_EXPORT __declspec(dllexport)
#else
#define FMW_EXPORT __attribute__((visibility("default")))
#endif

#ifdef __cplusplus
extern "C" {
#endif

#define FMW_PLUGIN_VERSION 2817 /* 0x0B01 */
#define FMW_TEXT_SIZE 261       /* 260 characters and the zero byte */

/* Error numbers: the program's status numbers. These are the ones a plug-in usually needs. */
#define FMW_ERROR_OPEN 1        /* the file cannot be opened */
#define FMW_ERROR_DAMAGED 2     /* the contents do not fit the format */
#define FMW_ERROR_READ 3        /* the file ends too early */
#define FMW_ERROR_UNSUPPORTED 5 /* this direction does not exist */
#define FMW_ERROR_MEMORY 6
#define FMW_ERROR_FORMAT 8  /* it is such a file, but of a variant that is not supported */
#define FMW_ERROR_CREATE 10 /* the output file cannot be created */
#define FMW_ERROR_WRITE 11
#define FMW_ERROR_COLORS 12     /* the picture is too deep */
#define FMW_ERROR_UNSUITABLE 13 /* the format cannot hold such a picture */

/* Format flags 2: what the formats of a module are. The program adds 0x200000 by itself. */
#define FMW_FORMAT_BITMAP 0x1
#define FMW_FORMAT_MULTI 0x4       /* files can hold more than one picture */
#define FMW_FORMAT_ALPHA 0x2000000 /* the writer stores an alpha channel */

/*
 * A memory block that crosses the boundary. On Windows it is a movable global memory handle;
 * elsewhere it is a pointer from malloc(). Who receives a block as a result frees it: the program
 * frees what ReadImage and GetComment return.
 */
typedef void* FMW_HANDLE;

#pragma pack(push, 1)

/* Filled by PLUGIN11GetPluginParams. The program clears it and sets size, version and instance. */
typedef struct FMW_PLUGIN_PARAMS {
  int32_t size;                   /*   0: 863 with 4-byte pointers, 867 with 8-byte ones */
  int32_t version;                /*   4 */
  int32_t reserved;               /*   8 */
  char textA[FMW_TEXT_SIZE];      /*  12: the module's name, for the list of plug-ins */
  char extensions[FMW_TEXT_SIZE]; /* 273: without dots, separated by ";": "pgm;ppm" */
  char textB[FMW_TEXT_SIZE];      /* 534: the formats' description, shown behind "(EXT) Plugin" */
  uint32_t flags1; /* 795: deepest picture that the writer takes, bits per pixel: 1, 8 or 24 */
  uint32_t flags2;                /* 799: FMW_FORMAT_ bits */
  void* instance; /* 803: the program's module instance, 0 where there is no such thing */
  uint8_t reserved2[56];          /* 807 */
} FMW_PLUGIN_PARAMS;

/* A row of the program's configuration table: 20 bytes with 4-byte pointers, 32 with 8-byte ones.
 */
typedef struct FMW_CONFIG_ENTRY {
  const char* name;     /* the key's name */
  const void*
      variable; /* where its value is: an int32_t, or a text of at least 33 bytes; read only */
  uint32_t type;        /* 0x1 flag, 0x2 text, 0x4 integer, 0x8 color ... */
  uint32_t control;
  const void* extra;
} FMW_CONFIG_ENTRY;

/* What the program offers during a call. Valid for that call only. */
typedef struct FMW_HOST_SERVICES {
  int32_t size;      /*  0: 64 with 4-byte pointers, 96 with 8-byte ones */
  int32_t version;   /*  4 */
  int32_t zero;      /*  8 */
  char mark[4];      /* 12: "RXaR" */
  uint8_t zero2[12]; /* 16 */
  /* Loads any picture that the program can read and returns it as a packed bitmap, or 0 with the
   * error number set. */
  FMW_HANDLE(FMW_CALL* loadPicture)(const char* fileName, int32_t* error); /* 28 */
  void(FMW_CALL* freePicture)(FMW_HANDLE bitmap); /* 32: frees what loadPicture returned */
  void(FMW_CALL* progressBegin)(void);                                     /* 36 */
  void(FMW_CALL* progressStep)(int32_t done, int32_t total);               /* 40 */
  void(FMW_CALL* progressEnd)(void);                                       /* 44 */
  void(FMW_CALL* setStatus)(const char* text); /* 48: replaces the status text */
  const FMW_CONFIG_ENTRY* configuration;       /* 52: the configuration table; read only */
  int32_t configurationCount;                                              /* 56: its rows */
  const char* comment; /* 60: in read calls the record's comment text, or 0 */
} FMW_HOST_SERVICES;

/* Filled by PLUGIN11GetInfo. The program clears it and sets size, version and frame. */
typedef struct FMW_PICTURE_INFO {
  int32_t size;          /*   0: 949 */
  int32_t version;       /*   4: leave it, or lower it when `typeName` is not filled */
  int32_t reserved;      /*   8 */
  int32_t width;         /*  12: pixels, at least 1 */
  int32_t height;        /*  16: rows, at least 1 */
  int32_t reserved2;     /*  20 */
  int32_t bitsPerPixel;  /*  24: 1 to 8, 24 or 32 */
  int32_t reserved3;     /*  28 */
  int32_t frame;         /*  32: in: the frame wanted, from 0; out: number of frames, 0 for one */
  int32_t reserved4;     /*  36 */
  int32_t dpiX;          /*  40: pixels per inch, 0 unknown */
  int32_t dpiY;          /*  44 */
  int32_t imageBytes;    /*  48: size of the pixel data, 0 to have it computed */
  uint8_t palette[768];  /*  52: 256 colors, red, green, blue */
  int32_t background;    /* 820: color behind a transparent picture, 0x00BBGGRR */
  uint8_t reserved5[60]; /* 824 */
  char typeName[65];     /* 884: the variant's name, "Portable graymap" */
} FMW_PICTURE_INFO;

/* Handed to PLUGIN11DoConfigure. */
typedef struct FMW_CONFIGURE {
  int32_t size;         /* 0: 48 */
  int32_t version;      /* 4 */
  uint8_t reserved[40]; /* 8 */
} FMW_CONFIGURE;

#pragma pack(pop)

/*
 * A packed bitmap, as ReadImage returns and WriteImage receives it: a 40-byte BITMAPINFOHEADER
 * (width, positive height, 1 plane, 1, 4, 8, 24 or, from plug-ins, 32 bits, no compression), the
 * color table of 2, 16 or 256 entries of blue, green, red, 0 for up to 8 bits, and the rows, bottom
 * row first, each padded to a multiple of 4 bytes. 24-bit pixels are blue, green, red; 32-bit ones
 * have an alpha byte behind them, 0 transparent.
 */

/* The exports. Names are exact; results are non-zero on success unless said otherwise. */
typedef const char*(FMW_CALL* FMW_GET_VERSION)(
    void); /* PLUGIN11GetVersion: the module's own version text */
typedef const char*(FMW_CALL* FMW_GET_COPYRIGHT)(void); /* PLUGIN11GetCopyright */
/* PLUGIN11GetPluginParams: what the module serves. `zero` is 0. */
typedef int32_t(FMW_CALL* FMW_GET_PARAMS)(FMW_PLUGIN_PARAMS* params, int32_t zero);
/* PLUGIN11ReadImage: decodes a file; a packed bitmap, or 0 with the error number set. */
typedef FMW_HANDLE(FMW_CALL* FMW_READ_IMAGE)(const char* fileName, int32_t* error,
                                             const FMW_HOST_SERVICES* services);
/* PLUGIN11WriteImage: writes `bitmap` (a packed bitmap that stays the program's) and the comment,
 * when there is one, to a new file. It has the destination's name, in an empty folder of its own.
 * PLUGIN11GetInfo is called for it next; a file that it does not recognize (except with the errors
 * FMW_ERROR_UNSUPPORTED and FMW_ERROR_FORMAT) counts as not written. */
typedef int32_t(FMW_CALL* FMW_WRITE_IMAGE)(const char* fileName, FMW_HANDLE bitmap,
                                           const char* comment, int32_t* error,
                                           const FMW_HOST_SERVICES* services);
/* PLUGIN11GetInfo: reads a file's header. */
typedef int32_t(FMW_CALL* FMW_GET_INFO)(FMW_PICTURE_INFO* info, const char* fileName,
                                        int32_t* error, const FMW_HOST_SERVICES* services);
/* PLUGIN11GetComment: the comment inside a file as a block with a zero-terminated text, or 0. */
typedef FMW_HANDLE(FMW_CALL* FMW_GET_COMMENT)(const char* fileName, int32_t* error, int32_t zero);
/* PLUGIN11DoConfigure: shows the plug-in's own settings; 0 when it has none. */
typedef int32_t(FMW_CALL* FMW_CONFIGURE_CALL)(FMW_CONFIGURE* block);

#ifdef __cplusplus
}
#endif

#endif
