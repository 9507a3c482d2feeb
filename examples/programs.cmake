# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# The small examples: each is built against VornJsonDb::vornjsondb, the target of this project and of
# the installed package, and a test compares what it prints with expected/NAME.txt.
set(example_folder ${CMAKE_CURRENT_LIST_DIR})

# prints_expected(NAME [ARGUMENT...]): when it is run with the arguments.
function(prints_expected name)
  add_test(NAME example_${name} COMMAND bash ${example_folder}/example_test.sh
    ${example_folder}/expected/${name}.txt $<TARGET_FILE:example_${name}> ${ARGN})
endfunction()

find_package(Threads REQUIRED)
foreach(name IN ITEMS inventory first_steps duplicate_keys nulls_and_raw_filters json_members
                      transactions two_threads log_on_syslog operated)
  add_executable(example_${name} ${example_folder}/${name}.cpp)
  target_link_libraries(example_${name} PRIVATE VornJsonDb::vornjsondb Threads::Threads)
  prints_expected(${name})
endforeach()

add_executable(example_sharded ${example_folder}/sharded.cpp)
target_link_libraries(example_sharded PRIVATE VornJsonDb::vornjsondb)
prints_expected(sharded ${CMAKE_CURRENT_BINARY_DIR}/tenants)

# The program has the flags and shows them to the plugin; of the library it needs only the header.
add_library(example_plugin_module MODULE ${example_folder}/plugin_module.cpp)
target_link_libraries(example_plugin_module PRIVATE VornJsonDb::vornjsondb)
add_executable(example_plugin ${example_folder}/plugin.cpp)
target_include_directories(example_plugin PRIVATE
  $<TARGET_PROPERTY:VornJsonDb::vornjsondb,INTERFACE_INCLUDE_DIRECTORIES>)
target_link_libraries(example_plugin PRIVATE JsonCpp::JsonCpp ${CMAKE_DL_LIBS})
set_target_properties(example_plugin PROPERTIES ENABLE_EXPORTS ON)
prints_expected(plugin $<TARGET_FILE:example_plugin_module>)
