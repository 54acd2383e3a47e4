# The solver of the plugin, which tests and benchmarks also compare decisions with.  VTSYM_Z3 says whether it is there.

foreach(part IN ITEMS INCLUDE LIBRARY)
  if(VTSYM_Z3_${part} AND NOT EXISTS ${VTSYM_Z3_${part}})
    unset(VTSYM_Z3_${part} CACHE) # it was removed
  endif()
endforeach()
find_path(VTSYM_Z3_INCLUDE z3.h)
find_library(VTSYM_Z3_LIBRARY z3)
set(VTSYM_Z3 OFF)
if(VTSYM_Z3_INCLUDE AND VTSYM_Z3_LIBRARY AND EXISTS ${VTSYM_Z3_INCLUDE}/z3.h)
  set(VTSYM_Z3 ON)
endif()
if(EXISTS /usr/include) # changes when the header comes or goes: configure again then
  set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS /usr/include)
endif()

function(vtsym_link_z3 target kind)
  if(NOT VTSYM_Z3)
    message(FATAL_ERROR "${target} needs the header and the library of Z3: install libz3-dev")
  endif()
  target_include_directories(${target} SYSTEM ${kind} ${VTSYM_Z3_INCLUDE})
  target_link_libraries(${target} ${kind} ${VTSYM_Z3_LIBRARY})
endfunction()
