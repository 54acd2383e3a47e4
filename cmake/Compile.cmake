# How everything is compiled: warnings, checks, sanitizers, the compiler cache.

set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)
set(CMAKE_EXPORT_COMPILE_COMMANDS ON)

find_program(VTSYM_CCACHE ccache)
if(VTSYM_CCACHE AND NOT CMAKE_CXX_COMPILER_LAUNCHER)
  # The slack that precompiled headers need.
  set(CMAKE_CXX_COMPILER_LAUNCHER ${CMAKE_COMMAND} -E env
      CCACHE_SLOPPINESS=pch_defines,time_macros,include_file_mtime,include_file_ctime ${VTSYM_CCACHE})
endif()

add_library(vtsym_options INTERFACE)
target_compile_options(vtsym_options INTERFACE -fPIC -Wall -Wextra -Wpedantic -Wconversion
  $<$<NOT:$<BOOL:${CMAKE_UNITY_BUILD}>>:-Wshadow> # names of several sources in one may shadow each other
  -fmacro-prefix-map=${PROJECT_SOURCE_DIR}/=)
if(CMAKE_CXX_COMPILER_ID STREQUAL GNU)
  target_compile_options(vtsym_options INTERFACE -fpch-preprocess)
  if(CMAKE_CXX_COMPILER_VERSION VERSION_LESS 13)
    # False alarms inside std::string and Boost.Container once they are inlined; the sanitizers see the real ones.
    target_compile_options(vtsym_options INTERFACE -Wno-restrict -Wno-stringop-overflow -Wno-stringop-overread
      -Wno-array-bounds)
  endif()
endif()
if(VTSYM_WERROR)
  target_compile_options(vtsym_options INTERFACE -Werror)
endif()
if(VTSYM_CHECKS)
  target_compile_definitions(vtsym_options INTERFACE VTSYM_CHECKS=1)
endif()
if(VTSYM_COVERAGE)
  target_link_options(vtsym_options INTERFACE -fprofile-instr-generate)
endif()
if(VTSYM_SANITIZE_THREAD)
  target_compile_options(vtsym_options INTERFACE -fsanitize=thread -fno-omit-frame-pointer)
  target_link_options(vtsym_options INTERFACE -fsanitize=thread)
endif()
if(VTSYM_SANITIZE)
  set(flags -fsanitize=address,undefined,float-cast-overflow,float-divide-by-zero,shift -fno-sanitize-recover=all
      -fno-omit-frame-pointer)
  target_compile_options(vtsym_options INTERFACE ${flags})
  target_link_options(vtsym_options INTERFACE ${flags})
  if(CMAKE_CXX_COMPILER_ID STREQUAL GNU)
    # Instrumented code misleads the data-flow warnings; the other builds have them.
    target_compile_options(vtsym_options INTERFACE -Wno-maybe-uninitialized)
  endif()
endif()
if(VTSYM_FUZZ)
  # Unsigned arithmetic wraps on purpose, in hashes and in numbers of more than one word; everything else that could be a
  # slip is an error, also where the language defines it.
  set(flags -fsanitize=fuzzer-no-link,address,undefined,float-cast-overflow,float-divide-by-zero,integer,nullability
      -fno-sanitize=unsigned-integer-overflow,unsigned-shift-base -fno-sanitize-recover=all -fno-omit-frame-pointer)
  target_compile_options(vtsym_options INTERFACE ${flags}
    -fsanitize-ignorelist=${PROJECT_SOURCE_DIR}/fuzz/libraries.txt)
  target_link_options(vtsym_options INTERFACE ${flags})
endif()
