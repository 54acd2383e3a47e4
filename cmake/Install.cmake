# Installed: the shared library, its headers, the CMake package, the pkg-config file, and the program with its manual page and
# completions.

include(CMakePackageConfigHelpers)

install(TARGETS vtsym EXPORT vtsymTargets LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR})
if(TARGET vtsym_z3)
  install(TARGETS vtsym_z3 LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}/vtsym COMPONENT z3)
endif()
if(TARGET vtsym_program)
  install(TARGETS vtsym_program RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR})

  # The program writes them itself, so that they show the options that it has.
  set(pages)
  function(vtsym_install_page name directory) # arguments of the program
    set(page ${PROJECT_BINARY_DIR}/pages/${name})
    add_custom_command(OUTPUT ${page}
      COMMAND ${CMAKE_COMMAND} -E make_directory ${PROJECT_BINARY_DIR}/pages
      COMMAND vtsym_program ${ARGN} > ${page}
      DEPENDS vtsym_program VERBATIM)
    install(FILES ${page} DESTINATION ${directory})
    set(pages ${pages} ${page} PARENT_SCOPE)
  endfunction()
  vtsym_install_page(vtsym.1 ${CMAKE_INSTALL_MANDIR}/man1 man)
  vtsym_install_page(vtsym ${CMAKE_INSTALL_DATADIR}/bash-completion/completions completion bash)
  vtsym_install_page(_vtsym ${CMAKE_INSTALL_DATADIR}/zsh/site-functions completion zsh)
  vtsym_install_page(vtsym.fish ${CMAKE_INSTALL_DATADIR}/fish/vendor_completions.d completion fish)
  add_custom_target(vtsym_pages ALL DEPENDS ${pages})
endif()

# The headers that the umbrella header reaches are the public ones.
set(open vtsym.hpp)
set(reached)
while(open)
  list(POP_FRONT open header)
  if(NOT header IN_LIST reached)
    list(APPEND reached ${header})
    file(STRINGS ${header} includes REGEX "^#include \"")
    list(TRANSFORM includes REPLACE "^#include \"([^\"]+)\".*" "\\1")
    list(APPEND open ${includes})
  endif()
endwhile()
set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${reached})
foreach(header IN LISTS reached)
  cmake_path(GET header PARENT_PATH folder)
  install(FILES ${header} DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/vtsym/${folder})
endforeach()

set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/vtsym)
install(EXPORT vtsymTargets NAMESPACE vtsym:: DESTINATION ${package_dir})
configure_package_config_file(cmake/vtsymConfig.cmake.in ${PROJECT_BINARY_DIR}/vtsymConfig.cmake
  INSTALL_DESTINATION ${package_dir})
write_basic_package_version_file(${PROJECT_BINARY_DIR}/vtsymConfigVersion.cmake COMPATIBILITY SameMinorVersion)
install(FILES ${PROJECT_BINARY_DIR}/vtsymConfig.cmake ${PROJECT_BINARY_DIR}/vtsymConfigVersion.cmake
  DESTINATION ${package_dir})

# Relative to the file itself, so that the installed tree can be moved.
file(RELATIVE_PATH pkgconfig_to_prefix /prefix/${CMAKE_INSTALL_LIBDIR}/pkgconfig /prefix)
configure_file(cmake/vtsym.pc.in ${PROJECT_BINARY_DIR}/vtsym.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/vtsym.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
