/*
 * Writing an image plug-in for Fotomill Professional.
 *
 * A plug-in is a shared library named FMWPL*.so (FMWPL*.DLL on Windows) in the folder "plugin"
 * next to the program. It handles one or more picture formats, one per file extension. This header
 * is all it needs; it is plain C and independent of the program's sources. docs/user/plugins.md
 * walks through a complete example.
 *
 * The program looks up eight functions by name. Three are required: PLUGIN11GetPluginParams,
 * PLUGIN11GetInfo and PLUGIN11ReadImage. The others are optional, and so are the PLUGIN12 functions
 * at the end of this header, which a module may export as well: metadata, pages, reduced sizes,
 * options. fotomill_plugin_kit.h has helpers for bitmaps and metadata blocks.
 *
 * Rules for every call:
 *  - Every block starts with its own size and the interface version, set by the program. Reject
 *    versions below FMW_PLUGIN_VERSION, and ignore bytes beyond the size you know.
 *  - Blocks are packed, without padding. With 8-byte pointers, the pointer fields are 8 bytes wide
 *    and later fields are shifted accordingly; the size field identifies the layout.
 *  - Texts are UTF-8 and NUL-terminated. File names are in the system's encoding.
 *  - Calls into a module are serialized, but may come from different threads.
 *  - A plug-in runs in a worker process with limited time and memory, which cannot write files
 *    unless it is called to write one. If it crashes or hangs, only the file at hand fails.
 *    Several worker processes may load the module at the same time. A module with
 *    FMW_FORMAT_IN_PROGRAM runs inside the program instead: if it crashes, so does the program.
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
#define FMW_TEXT_SIZE 261       /* 260 characters and the NUL */

/* Error numbers: the subset of the program's status numbers that plug-ins usually need. */
#define FMW_ERROR_OPEN 1        /* the file cannot be opened */
#define FMW_ERROR_DAMAGED 2     /* the file is damaged */
#define FMW_ERROR_READ 3        /* the file ends too early */
#define FMW_ERROR_UNSUPPORTED 5 /* reading or writing is not supported */
#define FMW_ERROR_MEMORY 6
#define FMW_ERROR_FORMAT 8  /* an unsupported variant of the format */
#define FMW_ERROR_CREATE 10 /* the output file cannot be created */
#define FMW_ERROR_WRITE 11
#define FMW_ERROR_COLORS 12     /* the picture has too many bits per pixel */
#define FMW_ERROR_UNSUITABLE 13 /* the format cannot store this picture */

/* Format flags 2: properties of a module's formats. The program adds 0x200000. */
#define FMW_FORMAT_BITMAP 0x1
#define FMW_FORMAT_MULTI 0x4       /* files may contain several pictures */
#define FMW_FORMAT_ALPHA 0x2000000 /* the writer stores an alpha channel */
/* For modules with PLUGIN12 functions: */
#define FMW_FORMAT_FRAMES 0x400          /* the pictures of a file are frames of an animation */
#define FMW_FORMAT_EXIF 0x4000000        /* the writer stores EXIF */
#define FMW_FORMAT_XMP 0x8000000         /* the writer stores XMP */
#define FMW_FORMAT_ICC 0x10000000        /* the writer stores a color profile */
#define FMW_FORMAT_COMMENT 0x20000000    /* the writer stores a comment */
#define FMW_FORMAT_IN_PROGRAM 0x40000000 /* runs inside the program, for windows of its own */

/*
 * A memory block passed between program and plug-in: a movable global memory handle on Windows, a
 * pointer from malloc() elsewhere. The receiver of a result frees it: the program frees the blocks
 * returned by ReadImage and GetComment.
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
  char textB[FMW_TEXT_SIZE];      /* 534: the formats' description, shown after "(EXT) Plugin" */
  uint32_t flags1; /* 795: maximum bits per pixel for the writer: 1, 8 or 24 */
  uint32_t flags2;                /* 799: FMW_FORMAT_ bits */
  void* instance; /* 803: the program's module instance, 0 on systems without */
  uint8_t reserved2[56];          /* 807 */
} FMW_PLUGIN_PARAMS;

/* A row of the program's configuration table: 20 bytes with 4-byte pointers, 32 with 8-byte ones.
 */
typedef struct FMW_CONFIG_ENTRY {
  const char* name;     /* the key's name */
  const void*
      variable; /* its value: an int32_t, or a text of at least 33 bytes; read-only */
  uint32_t type;        /* 0x1 flag, 0x2 text, 0x4 integer, 0x8 color ... */
  uint32_t control;
  const void* extra;
} FMW_CONFIG_ENTRY;

/* Services of the program, valid during the call only. */
typedef struct FMW_HOST_SERVICES {
  int32_t size;      /*  0: 64 with 4-byte pointers, 96 with 8-byte ones */
  int32_t version;   /*  4 */
  int32_t zero;      /*  8 */
  char mark[4];      /* 12: "RXaR" */
  uint8_t zero2[12]; /* 16 */
  /* Loads any picture the program can read and returns it as a packed bitmap, or 0 with the
   * error number set. */
  FMW_HANDLE(FMW_CALL* loadPicture)(const char* fileName, int32_t* error); /* 28 */
  void(FMW_CALL* freePicture)(FMW_HANDLE bitmap); /* 32: frees what loadPicture returned */
  void(FMW_CALL* progressBegin)(void);                                     /* 36 */
  void(FMW_CALL* progressStep)(int32_t done, int32_t total);               /* 40 */
  void(FMW_CALL* progressEnd)(void);                                       /* 44 */
  void(FMW_CALL* setStatus)(const char* text); /* 48: replaces the status text */
  const FMW_CONFIG_ENTRY* configuration;       /* 52: the configuration table; read-only */
  int32_t configurationCount;                                              /* 56: row count */
  const char* comment; /* 60: in read calls, the picture's comment, or 0 */
} FMW_HOST_SERVICES;

/* Filled by PLUGIN11GetInfo. The program clears it and sets size, version and frame. */
typedef struct FMW_PICTURE_INFO {
  int32_t size;          /*   0: 949 */
  int32_t version;       /*   4: leave it, or lower it if `typeName` is not set */
  int32_t reserved;      /*   8 */
  int32_t width;         /*  12: pixels, at least 1 */
  int32_t height;        /*  16: rows, at least 1 */
  int32_t reserved2;     /*  20 */
  int32_t bitsPerPixel;  /*  24: 1 to 8, 24 or 32 */
  int32_t reserved3;     /*  28 */
  int32_t frame;         /*  32: in: requested frame, from 0; out: number of frames, 0 for one */
  int32_t reserved4;     /*  36 */
  int32_t dpiX;          /*  40: pixels per inch, 0 if unknown */
  int32_t dpiY;          /*  44 */
  int32_t imageBytes;    /*  48: size of the pixel data; 0: computed by the program */
  uint8_t palette[768];  /*  52: 256 colors, red, green, blue */
  int32_t background;    /* 820: background of a transparent picture, 0x00BBGGRR */
  uint8_t reserved5[60]; /* 824 */
  char typeName[65];     /* 884: the variant's name, "Portable graymap" */
} FMW_PICTURE_INFO;

/* Passed to PLUGIN11DoConfigure. */
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
 * are followed by an alpha byte, 0 for transparent.
 */

/* The exports, under these exact names. Results are non-zero on success unless stated otherwise. */
typedef const char*(FMW_CALL* FMW_GET_VERSION)(
    void); /* PLUGIN11GetVersion: the module's own version text */
typedef const char*(FMW_CALL* FMW_GET_COPYRIGHT)(void); /* PLUGIN11GetCopyright */
/* PLUGIN11GetPluginParams: describes the module's formats. `zero` is 0. */
typedef int32_t(FMW_CALL* FMW_GET_PARAMS)(FMW_PLUGIN_PARAMS* params, int32_t zero);
/* PLUGIN11ReadImage: decodes a file; returns a packed bitmap, or 0 with the error number set. */
typedef FMW_HANDLE(FMW_CALL* FMW_READ_IMAGE)(const char* fileName, int32_t* error,
                                             const FMW_HOST_SERVICES* services);
/* PLUGIN11WriteImage: writes `bitmap` (a packed bitmap, owned by the program) and the comment, if
 * any, to a new file with the destination's name in an empty temporary folder. PLUGIN11GetInfo is
 * then called for it; if it does not recognize the file (except with FMW_ERROR_UNSUPPORTED or
 * FMW_ERROR_FORMAT), the write has failed. */
typedef int32_t(FMW_CALL* FMW_WRITE_IMAGE)(const char* fileName, FMW_HANDLE bitmap,
                                           const char* comment, int32_t* error,
                                           const FMW_HOST_SERVICES* services);
/* PLUGIN11GetInfo: reads a file's header. */
typedef int32_t(FMW_CALL* FMW_GET_INFO)(FMW_PICTURE_INFO* info, const char* fileName,
                                        int32_t* error, const FMW_HOST_SERVICES* services);
/* PLUGIN11GetComment: the comment of a file as a block with a NUL-terminated text, or 0. */
typedef FMW_HANDLE(FMW_CALL* FMW_GET_COMMENT)(const char* fileName, int32_t* error, int32_t zero);
/* PLUGIN11DoConfigure: opens the plug-in's settings dialog; 0 if it has none. */
typedef int32_t(FMW_CALL* FMW_CONFIGURE_CALL)(FMW_CONFIGURE* block);

/*
 * The PLUGIN12 functions, all optional. A module that exports one of them still exports the three
 * required PLUGIN11 functions, so that older programs can use it. The blocks below have 8-byte
 * fields for counts of bytes and no padding.
 */
#define FMW_PLUGIN_VERSION_12 3073 /* 0x0C01 */
#define FMW_OPTION_COUNT 16        /* options of a module at most */

#pragma pack(push, 1)

/* Passed to PLUGIN12ReadImage and PLUGIN12GetMetadata. */
typedef struct FMW_READ_REQUEST {
  int32_t size;    /* 0 */
  int32_t version; /* 4: 3073 or later */
  int32_t page;    /* 8: requested picture or frame, from 0 */
  /* 12: above 0: a reduced picture is enough if its longer edge is at least this long, pixels. It
   * need not be exact; a thumbnail or preview stored in the file is fine. */
  int32_t wantedSide;
  int32_t options[FMW_OPTION_COUNT]; /* 16: in the order of PLUGIN12GetOptions */
  /* 80: memory for a result, contents undefined; 0 if there is not enough. Saves a copy. A block
   * that is not returned after all is given back with `release`. */
  FMW_HANDLE(FMW_CALL* allocate)(uint64_t bytes);
  void(FMW_CALL* release)(FMW_HANDLE block);
} FMW_READ_REQUEST;

/* A block of bytes, allocated with malloc() by the module and freed by the program. */
typedef struct FMW_BLOCK {
  FMW_HANDLE data; /* 0: none */
  uint64_t size;   /* bytes */
} FMW_BLOCK;

/* What 8 bits per sample cannot hold: bits of FMW_METADATA.lost. */
#define FMW_LOST_DEPTH 1   /* more than 8 bits per sample */
#define FMW_LOST_INKS 2    /* colors other than RGB, or extra channels */
#define FMW_LOST_LAYERS 16 /* layers that were merged, or other pictures */

/* Filled by PLUGIN12GetMetadata. The program clears it and sets size and version. */
typedef struct FMW_METADATA {
  int32_t size;     /*  0 */
  int32_t version;  /*  4 */
  int32_t pages;    /*  8: pictures or frames of the file, 0 as PLUGIN11GetInfo said */
  int32_t rounds;   /* 12: times an animation plays, 0 for endless */
  uint32_t lost;    /* 16: FMW_LOST_ bits */
  int32_t width;    /* 20: the size with the options of the request, 0 as PLUGIN11GetInfo said */
  int32_t height;   /* 24 */
  FMW_BLOCK exif;   /* a TIFF structure, without "Exif\0\0"; orientation 1 if already applied */
  FMW_BLOCK xmp;    /* an XMP packet */
  FMW_BLOCK icc;    /* an ICC profile; none for sRGB */
  FMW_BLOCK delays; /* an int32_t for each frame of an animation, milliseconds */
} FMW_METADATA;

/* Passed to PLUGIN12WriteImage. */
typedef struct FMW_WRITE_REQUEST {
  int32_t size;     /*  0 */
  int32_t version;  /*  4 */
  int32_t quality;  /*  8: 1 to 100, if the user asked for one; 0: the module's own */
  int32_t lossless; /* 12: 1 if the user asked for lossless compression */
  int32_t dpiX;     /* 16: pixels per inch, 0 if unknown */
  int32_t dpiY;     /* 20 */
  int32_t options[FMW_OPTION_COUNT]; /* 24: in the order of PLUGIN12GetOptions */
  FMW_BLOCK exif, xmp, icc;          /* 88: owned by the program; empty if there is none */
  const char* comment;               /* 0 if there is none */
} FMW_WRITE_REQUEST;

/* Passed to PLUGIN12WriteAnimation. */
typedef struct FMW_FRAMES {
  int32_t size;          /*  0 */
  int32_t version;       /*  4: 3073 or later */
  int32_t count;         /*  8: frames, at least 1 */
  int32_t rounds;        /* 12: times the animation plays, 0 for endless */
  int32_t width, height; /* 16: of all frames, pixels */
  int32_t bits;          /* 24: per pixel of all frames, 24, or 32 if any of them is transparent */
  const int32_t* delays; /* 28: of each frame, milliseconds */
  /* A frame, from 0, as a packed bitmap that the next call replaces; 0 if it cannot be read. */
  FMW_HANDLE(FMW_CALL* frame)(const struct FMW_FRAMES* frames, int32_t index);
} FMW_FRAMES;

#pragma pack(pop)

/* An option of a module, which the program shows in the module's options box and stores. */
#define FMW_OPTION_SWITCH 0 /* 0 or 1 */
#define FMW_OPTION_NUMBER 1 /* from `least` to `most` */
#define FMW_OPTION_CHOICE 2 /* the number of a choice, from 0 */
typedef struct FMW_OPTION {
  const char* name;    /* letters and digits, as it is stored: "Quality" */
  const char* label;   /* as it is shown, in English: "Quality, 1 to 100" */
  int32_t kind;        /* FMW_OPTION_SWITCH, FMW_OPTION_NUMBER or FMW_OPTION_CHOICE */
  int32_t least, most; /* of a number */
  int32_t standard;    /* its value unless the user sets another one */
  const char* choices; /* of a choice, separated by ";": "small;medium;large" */
} FMW_OPTION;

/* PLUGIN12GetLibraries: the libraries that the module uses, a line for each: name, version, SPDX
 * license, separated by tabs. 0 or an empty text if there are none. */
typedef const char*(FMW_CALL* FMW_GET_LIBRARIES)(void);
/* PLUGIN12GetOptions: the module's options, valid as long as it is loaded. */
typedef const FMW_OPTION*(FMW_CALL* FMW_GET_OPTIONS)(int32_t* count);
/* PLUGIN12GetMetadata: called after PLUGIN11GetInfo, in the same way. A failure is no failure of
 * the file; its metadata are left out. */
typedef int32_t(FMW_CALL* FMW_GET_METADATA)(FMW_METADATA* metadata, const char* fileName,
                                            const FMW_READ_REQUEST* request, int32_t* error,
                                            const FMW_HOST_SERVICES* services);
/* PLUGIN12ReadImage: called instead of PLUGIN11ReadImage. */
typedef FMW_HANDLE(FMW_CALL* FMW_READ_IMAGE_12)(const char* fileName,
                                                const FMW_READ_REQUEST* request, int32_t* error,
                                                const FMW_HOST_SERVICES* services);
/* PLUGIN12WriteImage: called instead of PLUGIN11WriteImage, under the same rules. */
typedef int32_t(FMW_CALL* FMW_WRITE_IMAGE_12)(const char* fileName, FMW_HANDLE bitmap,
                                              const FMW_WRITE_REQUEST* request, int32_t* error,
                                              const FMW_HOST_SERVICES* services);
/* PLUGIN12WriteAnimation: writes a new file with several frames, each of them whole, under the
 * rules of PLUGIN11WriteImage. Only for modules with FMW_FORMAT_FRAMES. */
typedef int32_t(FMW_CALL* FMW_WRITE_ANIMATION)(const char* fileName, const FMW_FRAMES* frames,
                                               const FMW_WRITE_REQUEST* request, int32_t* error,
                                               const FMW_HOST_SERVICES* services);
/* PLUGIN12Transcode: stores the compressed picture of a file in the other format without decoding
 * it, so that nothing is lost; the extensions tell the formats. FMW_ERROR_UNSUPPORTED or
 * FMW_ERROR_FORMAT for files that it cannot do this with. */
typedef int32_t(FMW_CALL* FMW_TRANSCODE)(const char* source, const char* destination,
                                         int32_t* error, const FMW_HOST_SERVICES* services);

#ifdef __cplusplus
}
#endif

#endif
