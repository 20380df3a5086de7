# Modules that misbehave, one folder each, so that a test loads exactly the one it means.
set(odd_modules REFUSES GAPS_IN_LIST FORTY_FORMATS UNTERMINATED_TEXTS NO_INFO_EXPORT GARBAGE_SIZES ERROR_NUMBER
                SMALL_BLOCK WRONG_DEPTH EMPTY_RESULT HALF_WRITER SILENT_WRITER ODD_DEPTH OLDER LOADS_ANOTHER
                LAZY_WRITER EMPTY_WRITER NAME_WRITER BLIND_WRITER ERROR_42 ALL_FLAGS EXITS CRASHES EXITS_AT_ONCE COMMENTS HANGS SPINS EATS
                LARGER METADATA IN_PROGRAM GUEST_EXITS GUEST_CRASHES)
foreach(oddity IN LISTS odd_modules)
  add_library(odd_module_${oddity} MODULE plugins/odd_module.c)
  target_compile_definitions(odd_module_${oddity} PRIVATE ${oddity})
  target_include_directories(odd_module_${oddity} PRIVATE ${PROJECT_SOURCE_DIR}/src/plugins)
  target_compile_options(odd_module_${oddity} PRIVATE -fvisibility=hidden -Wno-conversion)
  set_target_properties(odd_module_${oddity} PROPERTIES PREFIX "" OUTPUT_NAME FMWPL_odd
                        LIBRARY_OUTPUT_DIRECTORY ${CMAKE_CURRENT_BINARY_DIR}/modules/${oddity})
  add_dependencies(test_plugins odd_module_${oddity})
endforeach()
add_dependencies(test_plugins FMWPL_pnm)
target_compile_definitions(test_plugins PRIVATE ODD_MODULES="${CMAKE_CURRENT_BINARY_DIR}/modules"
                           SAMPLE_MODULES="${CMAKE_BINARY_DIR}/plugin")
