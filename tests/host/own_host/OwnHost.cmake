# A program that is its own host: every layer but the embedded host links with it, and its services are the ones that answer.

set(own_host_layers ${VTSYM_LAYER_TARGETS})
list(REMOVE_ITEM own_host_layers vtsym_embedded)
add_executable(own_host ${CMAKE_CURRENT_LIST_DIR}/OwnHost.cpp)
target_link_libraries(own_host PRIVATE ${own_host_layers})
add_test(NAME own_host COMMAND own_host)
