# Compiles the C++ of the pages in docs/ against the library as others use it, runs it, and compares what it prints with the page.

file(GLOB_RECURSE pages CONFIGURE_DEPENDS ${PROJECT_SOURCE_DIR}/docs/*.md)
file(MAKE_DIRECTORY ${PROJECT_BINARY_DIR}/pages)
set(script ${CMAKE_CURRENT_LIST_DIR}/program_of_page.awk)
set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${pages}) # a page may get its first program
foreach(page IN LISTS pages)
  file(STRINGS ${page} programs REGEX "^```cpp$")
  if(NOT programs)
    continue()
  endif()
  cmake_path(GET page STEM name)
  set(source ${PROJECT_BINARY_DIR}/pages/${name}.cpp)
  set(output ${PROJECT_BINARY_DIR}/pages/${name}.txt)
  add_custom_command(OUTPUT ${source} ${output}
    COMMAND awk -v source=${source} -v expected=${output} -f ${script} ${page}
    DEPENDS ${page} ${script} VERBATIM)
  add_executable(page_${name} ${source} ${output})
  target_link_libraries(page_${name} PRIVATE vtsym)
  if(VTSYM_SANITIZE)
    target_link_options(page_${name} PRIVATE -fsanitize=address,undefined) # the runtime has to come first
  endif()
  target_compile_options(page_${name} PRIVATE -Wall -Wextra -Wpedantic $<$<BOOL:${VTSYM_WERROR}>:-Werror>)
  add_test(NAME pages.${name} COMMAND sh -c "\"$1\" >\"$2.out\" && diff -u \"$2\" \"$2.out\"" sh $<TARGET_FILE:page_${name}> ${output})
endforeach()
