# A file system that does not answer, for tests of the windows. It is preloaded, which programs built
# with sanitizers do not allow.
if(CMAKE_SYSTEM_NAME STREQUAL "Linux" AND NOT FOTOMILL_SANITIZE)
  add_library(slow_files MODULE desktop/slow/slow_files.c)
  target_link_libraries(slow_files PRIVATE ${CMAKE_DL_LIBS})
  set_target_properties(slow_files PROPERTIES PREFIX "" LIBRARY_OUTPUT_DIRECTORY ${CMAKE_CURRENT_BINARY_DIR})
  add_dependencies(test_desktop slow_files)
endif()
