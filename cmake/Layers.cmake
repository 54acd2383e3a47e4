# One object library per layer, the shared library made of them, and the program.

find_package(Boost 1.74 REQUIRED)

# The sources of a layer; folders are searched on every build, so that a new file needs no edit here.
function(vtsym_sources layer result)
  list(TRANSFORM VTSYM_FOLDERS_${layer} APPEND /*.cpp OUTPUT_VARIABLE patterns)
  file(GLOB sources CONFIGURE_DEPENDS ${patterns})
  if(VTSYM_MUTANTS) # copies with mutants take the place of what they were made from
    set(mutated)
    foreach(source IN LISTS sources)
      cmake_path(RELATIVE_PATH source BASE_DIRECTORY ${PROJECT_SOURCE_DIR} OUTPUT_VARIABLE copy)
      cmake_path(ABSOLUTE_PATH copy BASE_DIRECTORY ${VTSYM_MUTANTS})
      if(EXISTS ${copy})
        list(APPEND mutated ${copy})
      else()
        list(APPEND mutated ${source})
      endif()
    endforeach()
    set(sources ${mutated})
  endif()
  set(${result} ${sources} PARENT_SCOPE)
endfunction()

set(VTSYM_BUILT_LAYERS ${VTSYM_LAYERS})
if(NOT VTSYM_EMBEDDED_HOST)
  list(REMOVE_ITEM VTSYM_BUILT_LAYERS embedded)
endif()

set(VTSYM_LAYER_TARGETS) # those that have objects
foreach(layer IN LISTS VTSYM_BUILT_LAYERS)
  vtsym_sources(${layer} sources)
  if(sources)
    add_library(vtsym_${layer} OBJECT ${sources})
    set(kind PUBLIC)
    if(NOT TARGET vtsym_precompiled)
      add_library(vtsym_precompiled OBJECT cmake/precompiled.cpp)
      target_link_libraries(vtsym_precompiled PUBLIC vtsym_options Boost::headers)
      target_precompile_headers(vtsym_precompiled PRIVATE cmake/precompiled.hpp)
    endif()
    target_precompile_headers(vtsym_${layer} REUSE_FROM vtsym_precompiled)
    list(APPEND VTSYM_LAYER_TARGETS vtsym_${layer})
    if(VTSYM_COVERAGE)
      target_compile_options(vtsym_${layer} PRIVATE -fprofile-instr-generate -fcoverage-mapping)
    endif()
  else()
    add_library(vtsym_${layer} INTERFACE)
    set(kind INTERFACE)
  endif()
  target_include_directories(vtsym_${layer} ${kind} ${PROJECT_SOURCE_DIR})
  target_link_libraries(vtsym_${layer} ${kind} vtsym_options Boost::headers)
  foreach(used IN LISTS VTSYM_ARROWS_${layer})
    target_link_libraries(vtsym_${layer} ${kind} vtsym_${used})
  endforeach()
endforeach()

if(VTSYM_EMBEDDED_HOST)
  find_package(fmt REQUIRED)
  find_package(spdlog REQUIRED)
  find_package(nlohmann_json REQUIRED)
  target_link_libraries(vtsym_embedded PUBLIC fmt::fmt spdlog::spdlog nlohmann_json::nlohmann_json)
endif()

if(VTSYM_SANITIZE AND CMAKE_CXX_COMPILER_ID STREQUAL GNU)
  # The grammar nests as deep as its bound allows.  With guards around every temporary its frames are so large that the bound
  # would no longer fit the default stack.
  set_source_files_properties(parser/ConditionGrammar.cpp PROPERTIES COMPILE_OPTIONS "--param=asan-stack=0"
    SKIP_PRECOMPILE_HEADERS ON)
endif()

# Links every layer into a target that uses what the library does not export: tests and benchmarks.
function(vtsym_link_layers target)
  target_link_libraries(${target} PRIVATE ${VTSYM_LAYER_TARGETS})
endfunction()

add_library(vtsym SHARED)
add_library(vtsym::vtsym ALIAS vtsym)
target_link_libraries(vtsym PRIVATE ${VTSYM_LAYER_TARGETS} PUBLIC Boost::headers)
target_compile_features(vtsym PUBLIC cxx_std_20)
target_include_directories(vtsym INTERFACE $<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}>
  $<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}/vtsym>)
set_target_properties(vtsym PROPERTIES VERSION ${PROJECT_VERSION} SOVERSION ${VTSYM_ABI}
  LINKER_LANGUAGE CXX LIBRARY_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/lib)
# The library calls its own functions, whatever else the process has of the same names: loading it need not look them up.
target_link_options(vtsym PRIVATE -Wl,-Bsymbolic-functions)
if(VTSYM_EMBEDDED_HOST AND NOT VTSYM_SANITIZE AND NOT VTSYM_SANITIZE_THREAD)
  target_link_options(vtsym PRIVATE -Wl,--no-undefined)
endif()

# The solver for what the library's own procedures leave open, in a library of its own that is loaded on demand.  A
# header that is installed later is found then: its folder changes.
target_link_libraries(vtsym PRIVATE ${CMAKE_DL_LIBS})
include(cmake/Z3.cmake)
if(VTSYM_Z3)
  add_library(vtsym_z3 MODULE plugins/z3/Z3Plugin.cpp)
  target_include_directories(vtsym_z3 PRIVATE ${PROJECT_SOURCE_DIR})
  target_link_libraries(vtsym_z3 PRIVATE vtsym_options)
  vtsym_link_z3(vtsym_z3 PRIVATE)
  set_target_properties(vtsym_z3 PROPERTIES OUTPUT_NAME vtsym-z3 LIBRARY_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/lib/vtsym)
endif()

# The program needs the embedded host.  What its commands do is a library of their own, which others link too.
if(VTSYM_PROGRAM AND VTSYM_EMBEDDED_HOST)
  set(tool_sources)
  foreach(layer IN LISTS VTSYM_PROGRAM_LAYERS)
    vtsym_sources(${layer} sources)
    if(layer STREQUAL program)
      set(main_sources ${sources})
    else()
      list(APPEND tool_sources ${sources})
    endif()
  endforeach()
  find_package(CLI11 REQUIRED)
  find_package(tomlplusplus REQUIRED)
  find_package(TBB REQUIRED)
  find_path(VTSYM_XXHASH_INCLUDE xxhash.h REQUIRED)
  find_library(VTSYM_EDIT_LIBRARY edit REQUIRED)
  add_library(vtsym_tool STATIC ${tool_sources})
  add_executable(vtsym_program ${main_sources})
  set(tool_libraries CLI11::CLI11 nlohmann_json::nlohmann_json tomlplusplus::tomlplusplus TBB::tbb ${VTSYM_EDIT_LIBRARY})
  target_link_libraries(vtsym_tool PUBLIC vtsym vtsym_options PRIVATE ${tool_libraries})
  target_compile_definitions(vtsym_tool PUBLIC VTSYM_VERSION="${PROJECT_VERSION}")
  target_link_libraries(vtsym_program PRIVATE vtsym_tool)
  foreach(target vtsym_tool vtsym_program)
    target_precompile_headers(${target} REUSE_FROM vtsym_precompiled)
    # The program spends its time in the library; more optimisation of its own code would only lengthen the build.
    target_compile_options(${target} PRIVATE $<$<NOT:$<CONFIG:Debug>>:-O1>)
  endforeach()
  set_target_properties(vtsym_program PROPERTIES OUTPUT_NAME vtsym
    RUNTIME_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/bin INSTALL_RPATH $ORIGIN/../${CMAKE_INSTALL_LIBDIR})
  if(TARGET vtsym_z3)
    add_dependencies(vtsym_program vtsym_z3)
  endif()
endif()
