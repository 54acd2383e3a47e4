# Installs the library into an empty place and builds and runs an outside program against it: by the CMake package, and by
# pkg-config where that is found.  Run as a script with BUILD, COMPILER and VERSION set.

set(prefix ${BUILD}/package-test)
file(REMOVE_RECURSE ${prefix})

function(run)
  execute_process(COMMAND ${ARGN} OUTPUT_VARIABLE output ERROR_VARIABLE output RESULT_VARIABLE result)
  if(NOT result EQUAL 0)
    list(JOIN ARGN " " command)
    message(FATAL_ERROR "${command}\n${output}")
  endif()
  set(output "${output}" PARENT_SCOPE)
endfunction()

function(expect_greeting how)
  if(NOT output STREQUAL "vtsym ${VERSION}: (sim) is a keyword\n")
    message(FATAL_ERROR "the program built by ${how} says: ${output}")
  endif()
endfunction()

run(${CMAKE_COMMAND} --install ${BUILD} --prefix ${prefix}/tree)
foreach(private IN ITEMS base/core/Table.cpp base/cover/Cover.hpp host/embedded tests)
  if(EXISTS ${prefix}/tree/include/vtsym/${private})
    message(FATAL_ERROR "installed, but private: ${private}")
  endif()
endforeach()

run(${CMAKE_COMMAND} -G Ninja -S ${CMAKE_CURRENT_LIST_DIR}/program -B ${prefix}/program
  -DCMAKE_PREFIX_PATH=${prefix}/tree -DCMAKE_CXX_COMPILER=${COMPILER} -DEXPECTED_VERSION=${VERSION})
run(${CMAKE_COMMAND} --build ${prefix}/program)
run(${prefix}/program/outside)
expect_greeting("CMake")

# Inside another project, the library alone is built, and nothing of it is installed.  ./package builds it from its archive.
run(${CMAKE_COMMAND} -G Ninja -S ${CMAKE_CURRENT_LIST_DIR}/program -B ${prefix}/inside
  -DVTSYM_FOLDER=${CMAKE_CURRENT_LIST_DIR}/../.. -DCMAKE_CXX_COMPILER=${COMPILER} -DEXPECTED_VERSION=${VERSION})
run(ninja -C ${prefix}/inside -t commands)
if(output MATCHES "tools/vtsym/main|tests/core|libgtest" OR NOT output MATCHES "libvtsym\\.so")
  message(FATAL_ERROR "inside another project, this is built: ${output}")
endif()
run(${CMAKE_COMMAND} -E env DESTDIR=${prefix}/nothing ${CMAKE_COMMAND} -P ${prefix}/inside/cmake_install.cmake)
file(GLOB_RECURSE installed ${prefix}/nothing/*)
if(installed)
  message(FATAL_ERROR "inside another project, this is installed: ${installed}")
endif()

find_program(PKG_CONFIG pkg-config)
if(PKG_CONFIG)
  file(GLOB_RECURSE description ${prefix}/tree/*/vtsym.pc)
  cmake_path(GET description PARENT_PATH directory)
  set(ENV{PKG_CONFIG_PATH} ${directory})
  run(${PKG_CONFIG} --cflags --libs vtsym)
  separate_arguments(flags UNIX_COMMAND "${output}")
  run(${PKG_CONFIG} --variable=libdir vtsym)
  string(STRIP "${output}" libdir)
  run(${COMPILER} -std=c++20 -DEXPECTED_VERSION="${VERSION}" ${CMAKE_CURRENT_LIST_DIR}/program/outside.cpp -o
    ${prefix}/outside ${flags} -Wl,-rpath,${libdir})
  run(${prefix}/outside)
  expect_greeting("pkg-config")
endif()
