# Makes the locales that the tests set, in the build folder, whatever locales the machine has.

find_program(VTSYM_LOCALEDEF localedef REQUIRED)
set(VTSYM_TEST_LOCALES ${PROJECT_BINARY_DIR}/locales)

set(made)
foreach(locale de_DE.UTF-8 de_DE.ISO-8859-1 tr_TR.UTF-8)
  string(REGEX MATCH "^([^.]*)\\.(.*)$" ignored ${locale})
  set(definition ${VTSYM_TEST_LOCALES}/${locale}/LC_NUMERIC)
  add_custom_command(OUTPUT ${definition}
    COMMAND ${CMAKE_COMMAND} -E make_directory ${VTSYM_TEST_LOCALES}
    COMMAND ${VTSYM_LOCALEDEF} --no-archive -i ${CMAKE_MATCH_1} -f ${CMAKE_MATCH_2} ${VTSYM_TEST_LOCALES}/${locale}
    VERBATIM)
  list(APPEND made ${definition})
endforeach()
add_custom_target(vtsym_test_locales DEPENDS ${made})
