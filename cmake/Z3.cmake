# The solver that decisions are compared with, in tests and benchmarks only.

find_path(VTSYM_Z3_INCLUDE z3.h REQUIRED)
find_library(VTSYM_Z3_LIBRARY z3 REQUIRED)

function(vtsym_link_z3 target kind)
  target_include_directories(${target} SYSTEM ${kind} ${VTSYM_Z3_INCLUDE})
  target_link_libraries(${target} ${kind} ${VTSYM_Z3_LIBRARY})
endfunction()
