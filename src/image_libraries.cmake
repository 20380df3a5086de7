# The libraries for decoding and encoding pictures and drawing text, as `image_libraries` and `image_include_folders`, and
# for the program's own list which are linked and how: `linked_libraries`, NAME=VERSION=inside|shared.
#
# They are linked statically if the system has static libraries: loading them would slow down every run, and most runs need
# none. The dependencies of static libraries differ between releases; pkg-config knows them. If an archive is missing, or
# static linking fails, shared libraries are used.
find_package(PkgConfig REQUIRED)
pkg_check_modules(IMAGES REQUIRED libtiff-4 libwebp libjpeg libpng lcms2 freetype2 fribidi libdeflate zlib pugixml)
# Debian 13's lcms2 names its plug-ins. They are GPL-3.0 and not used here.
foreach(list IMAGES_LIBRARIES IMAGES_LINK_LIBRARIES IMAGES_STATIC_LIBRARIES)
  list(FILTER ${list} EXCLUDE REGEX "lcms2_(fast_float|threaded)")
endforeach()
# Headers only: both are loaded when text is first drawn.
pkg_check_modules(TEXTS REQUIRED harfbuzz fontconfig)
set(image_include_folders ${IMAGES_INCLUDE_DIRS} ${TEXTS_INCLUDE_DIRS})

set(c_library_parts c m pthread dl rt stdc++ gcc_s)  # never linked statically, as the program loads the shared C library
set(static_set "")
foreach(name IN LISTS IMAGES_STATIC_LIBRARIES)
  set(item ${name})
  if(NOT name IN_LIST c_library_parts)
    find_library(ARCHIVE_${name} NAMES lib${name}.a HINTS ${IMAGES_STATIC_LIBRARY_DIRS})
    mark_as_advanced(ARCHIVE_${name})
    if(ARCHIVE_${name})
      set(item ${ARCHIVE_${name}})
    endif()
  endif()
  list(APPEND static_set ${item})
endforeach()
list(REMOVE_DUPLICATES static_set)
set(static_set "$<LINK_GROUP:RESCAN,${static_set}>")

include(CheckCXXSourceCompiles)
set(CMAKE_REQUIRED_LIBRARIES ${static_set} Threads::Threads)
check_cxx_source_compiles([[
extern "C" {
char TIFFOpen(); char WebPDecode(); char WebPEncode(); char jpeg_start_decompress(); char jpeg_start_compress();
char png_read_image(); char png_write_image(); char cmsCreateTransform(); char FT_Open_Face(); char inflate();
char libdeflate_alloc_compressor(); char fribidi_get_bidi_types();
}
int main() {
  return TIFFOpen() + WebPDecode() + WebPEncode() + jpeg_start_decompress() + jpeg_start_compress() + png_read_image() +
         png_write_image() + cmsCreateTransform() + FT_Open_Face() + inflate() + libdeflate_alloc_compressor() +
         fribidi_get_bidi_types();
}]] STATIC_IMAGE_LIBRARIES_LINK)
unset(CMAKE_REQUIRED_LIBRARIES)
if(STATIC_IMAGE_LIBRARIES_LINK AND NOT FOTOMILL_DISTRIBUTION)
  set(image_libraries ${static_set})
  set(linked_names ${IMAGES_STATIC_LIBRARIES})
else()
  set(image_libraries ${IMAGES_LINK_LIBRARIES})
  set(linked_names ${IMAGES_LIBRARIES})
endif()

list(REMOVE_DUPLICATES linked_names)
list(REMOVE_ITEM linked_names ${c_library_parts})
set(linked_libraries "")
foreach(name IN LISTS linked_names)
  pkg_search_module(LINKED_${name} QUIET lib${name} ${name} ${name}2)
  set(how shared)
  if(STATIC_IMAGE_LIBRARIES_LINK AND NOT FOTOMILL_DISTRIBUTION AND ARCHIVE_${name})
    set(how inside)
  endif()
  string(APPEND linked_libraries "${name}=${LINKED_${name}_VERSION}=${how} ")
endforeach()
