# The solver that decisions are compared with, in tests and benchmarks only.  Where it is absent the comparison is skipped.

find_path(VTSYM_Z3_INCLUDE z3.h)
find_library(VTSYM_Z3_LIBRARY z3)

function(vtsym_link_z3 target kind)
  if(VTSYM_Z3_INCLUDE AND VTSYM_Z3_LIBRARY)
    target_compile_definitions(${target} ${kind} VTSYM_HAVE_Z3)
    target_include_directories(${target} SYSTEM ${kind} ${VTSYM_Z3_INCLUDE})
    target_link_libraries(${target} ${kind} ${VTSYM_Z3_LIBRARY})
  endif()
endfunction()
