// Preloaded into the program by a test: a folder of a file system that does not answer. Calls for
// files below SLOW_FOLDER wait as long as the file SLOW_WHILE exists. Those of the main thread, in
// which windows work, are written to the file SLOW_LOG instead.
#define _GNU_SOURCE
#include <dirent.h>
#include <dlfcn.h>
#include <fcntl.h>
#include <stdarg.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/inotify.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

static int Taken(const char* path) {  // there, asked without this module
  return syscall(SYS_access, path, F_OK) == 0;
}

static void Pass(const char* function, const char* path) {
  const char* const folder = getenv("SLOW_FOLDER");
  const char* const while_ = getenv("SLOW_WHILE");
  const char* const log = getenv("SLOW_LOG");
  if (path == NULL || folder == NULL || while_ == NULL || log == NULL) return;
  if (strncmp(path, folder, strlen(folder)) != 0 || !Taken(while_)) return;
  if (syscall(SYS_gettid) == getpid()) {
    char line[4200];
    const int length = snprintf(line, sizeof line, "%s %s\n", function, path);
    const int file = (int)syscall(SYS_openat, AT_FDCWD, log, O_WRONLY | O_CREAT | O_APPEND, 0600);
    if (file >= 0 && length > 0 && write(file, line, (size_t)length) < 0) abort();
    if (file >= 0) close(file);
    return;
  }
  while (Taken(while_)) usleep(20000);
}

#define REAL(result, name, ...) \
  static result (*real)(__VA_ARGS__); \
  if (real == NULL) *(void**)&real = dlsym(RTLD_NEXT, #name);

#define STAT(name, type)                                  \
  int name(const char* path, type* facts) {               \
    REAL(int, name, const char*, type*)                   \
    Pass(#name, path);                                    \
    return real(path, facts);                             \
  }
STAT(stat, struct stat)
STAT(stat64, struct stat64)
STAT(lstat, struct stat)
STAT(lstat64, struct stat64)

#define STAT_AT(name, type)                                                  \
  int name(int at, const char* path, type* facts, int flags) {               \
    REAL(int, name, int, const char*, type*, int)                            \
    Pass(#name, path);                                                       \
    return real(at, path, facts, flags);                                     \
  }
STAT_AT(fstatat, struct stat)
STAT_AT(fstatat64, struct stat64)

int statx(int at, const char* path, int flags, unsigned mask, struct statx* facts) {
  REAL(int, statx, int, const char*, int, unsigned, struct statx*)
  Pass("statx", path);
  return real(at, path, flags, mask, facts);
}

#define OPEN(name)                               \
  int name(const char* path, int flags, ...) {   \
    REAL(int, name, const char*, int, ...)       \
    va_list more;                                \
    va_start(more, flags);                       \
    const unsigned mode = va_arg(more, unsigned); \
    va_end(more);                                \
    Pass(#name, path);                           \
    return real(path, flags, mode);              \
  }
OPEN(open)
OPEN(open64)

#define OPEN_AT(name)                                   \
  int name(int at, const char* path, int flags, ...) {  \
    REAL(int, name, int, const char*, int, ...)         \
    va_list more;                                       \
    va_start(more, flags);                              \
    const unsigned mode = va_arg(more, unsigned);       \
    va_end(more);                                       \
    Pass(#name, path);                                  \
    return real(at, path, flags, mode);                 \
  }
OPEN_AT(openat)
OPEN_AT(openat64)

DIR* opendir(const char* path) {
  REAL(DIR*, opendir, const char*)
  Pass("opendir", path);
  return real(path);
}

int access(const char* path, int mode) {
  REAL(int, access, const char*, int)
  Pass("access", path);
  return real(path, mode);
}
