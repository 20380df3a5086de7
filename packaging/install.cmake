# What `cmake --install` and `./fotomill install` put where, by component: cli (the command line), plugins, desktop.
# A build without wxWidgets has no desktop component; everything else is always there.
include(GNUInstallDirs)
set(packaging_folder ${CMAKE_CURRENT_LIST_DIR})

install(TARGETS fotomill DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT cli)
if(MSGFMT)
  install(DIRECTORY ${CMAKE_BINARY_DIR}/locale DESTINATION ${CMAKE_INSTALL_DATADIR} COMPONENT cli)
endif()
install(DIRECTORY ${PROJECT_SOURCE_DIR}/docs/user/ DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/fotomill COMPONENT cli
        FILES_MATCHING PATTERN "*.md" PATTERN "*.png")

# Completions and man pages are printed by the program, so they know every command and option that it knows.
set(printed ${CMAKE_BINARY_DIR}/printed)
install(CODE "
  file(REMOVE_RECURSE ${printed})
  file(MAKE_DIRECTORY ${printed})
  set(ENV{LANGUAGE} en)
  execute_process(COMMAND $<TARGET_FILE:fotomill> manual ${printed}/man1 COMMAND_ERROR_IS_FATAL ANY)
  foreach(shell bash zsh fish)
    execute_process(COMMAND $<TARGET_FILE:fotomill> completion \${shell} OUTPUT_FILE ${printed}/\${shell} COMMAND_ERROR_IS_FATAL ANY)
  endforeach()" COMPONENT cli)
install(DIRECTORY ${printed}/man1 DESTINATION ${CMAKE_INSTALL_MANDIR} COMPONENT cli)
install(FILES ${printed}/bash DESTINATION ${CMAKE_INSTALL_DATADIR}/bash-completion/completions RENAME fotomill COMPONENT cli)
install(FILES ${printed}/zsh DESTINATION ${CMAKE_INSTALL_DATADIR}/zsh/site-functions RENAME _fotomill COMPONENT cli)
install(FILES ${printed}/fish DESTINATION ${CMAKE_INSTALL_DATADIR}/fish/vendor_completions.d RENAME fotomill.fish COMPONENT cli)

# Beside the libraries of no architecture's own folder: the program looks for ../lib/fotomill/plugin from where it lies.
install(TARGETS FMWPL_pnm LIBRARY DESTINATION lib/fotomill/plugin COMPONENT plugins)

# What authors of plug-ins begin with.
install(FILES ${PROJECT_SOURCE_DIR}/src/plugins/fotomill_plugin.h ${PROJECT_SOURCE_DIR}/samples/plugin/pnm.c
        DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/fotomill/examples COMPONENT plugins)

if(TARGET fotomill-faces)
  install(TARGETS fotomill-faces LIBRARY DESTINATION lib/fotomill COMPONENT plugins)
endif()

if(TARGET fotomill-desktop)
  set(desktop_files ${packaging_folder}/desktop)
  install(TARGETS fotomill-desktop DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT desktop)
  install(FILES ${desktop_files}/fotomill-desktop.1 DESTINATION ${CMAKE_INSTALL_MANDIR}/man1 COMPONENT desktop)
  install(FILES ${desktop_files}/fotomill-desktop.desktop DESTINATION ${CMAKE_INSTALL_DATADIR}/applications COMPONENT desktop)
  install(FILES ${desktop_files}/fotomill-desktop.metainfo.xml DESTINATION ${CMAKE_INSTALL_DATADIR}/metainfo COMPONENT desktop)
  install(FILES ${desktop_files}/fotomill-formats.xml DESTINATION ${CMAKE_INSTALL_DATADIR}/mime/packages COMPONENT desktop)
  install(FILES ${desktop_files}/fotomill.thumbnailer DESTINATION ${CMAKE_INSTALL_DATADIR}/thumbnailers COMPONENT desktop)
  set(icons ${CMAKE_INSTALL_DATADIR}/icons/hicolor)
  install(FILES ${desktop_files}/fotomill-desktop.svg DESTINATION ${icons}/scalable/apps COMPONENT desktop)
  # Desktops without an SVG loader take the sizes drawn here.
  find_program(RSVG_CONVERT rsvg-convert)
  if(RSVG_CONVERT)
    set(drawn_icons)
    foreach(side 16 22 24 32 48 64 128 256)
      set(icon ${CMAKE_BINARY_DIR}/icons/${side}x${side}/fotomill-desktop.png)
      add_custom_command(OUTPUT ${icon} DEPENDS ${desktop_files}/fotomill-desktop.svg
                         COMMAND ${CMAKE_COMMAND} -E make_directory ${CMAKE_BINARY_DIR}/icons/${side}x${side}
                         COMMAND ${RSVG_CONVERT} -w ${side} -h ${side} -o ${icon} ${desktop_files}/fotomill-desktop.svg VERBATIM)
      list(APPEND drawn_icons ${icon})
      install(FILES ${icon} DESTINATION ${icons}/${side}x${side}/apps COMPONENT desktop)
    endforeach()
    add_custom_target(icons ALL DEPENDS ${drawn_icons})
  endif()
endif()
