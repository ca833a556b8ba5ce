# SPDX-License-Identifier: Apache-2.0
# Every folder is a room: one static library with the rooms that it may know declared as its dependencies.
#
#   probeview_room(NAME SOURCES file… [KNOWS room…] [LINKS library…])   library pv_NAME
#   probeview_program(NAME SOURCES file… KNOWS room…)                   executable bin/NAME
#   probeview_test(NAME SOURCES file… KNOWS room… [LINKS library…] [ENVIRONMENT VAR=value…])
#                                                                       GoogleTest executable, one CTest entry per test
include_guard()

function(probeview_room name)
  cmake_parse_arguments(ARG "" "" "SOURCES;KNOWS;LINKS" ${ARGN})
  add_library(pv_${name} STATIC ${ARG_SOURCES})
  list(TRANSFORM ARG_KNOWS PREPEND pv_)
  target_link_libraries(pv_${name} PUBLIC probeview_settings ${ARG_KNOWS} ${ARG_LINKS})
  probeview_use_compiled_headers(pv_${name})
endfunction()

function(probeview_program name)
  cmake_parse_arguments(ARG "" "" "SOURCES;KNOWS;LINKS" ${ARGN})
  add_executable(${name} ${ARG_SOURCES})
  list(TRANSFORM ARG_KNOWS PREPEND pv_)
  target_link_libraries(${name} PRIVATE probeview_settings ${ARG_KNOWS} ${ARG_LINKS})
  probeview_use_compiled_headers(${name})
endfunction()

function(probeview_test name)
  cmake_parse_arguments(ARG "" "" "SOURCES;KNOWS;LINKS;ENVIRONMENT" ${ARGN})
  add_executable(${name} ${ARG_SOURCES})
  list(TRANSFORM ARG_KNOWS PREPEND pv_)
  target_link_libraries(${name} PRIVATE probeview_settings ${ARG_KNOWS} ${ARG_LINKS} GTest::gtest_main GTest::gmock)
  set_target_properties(${name} PROPERTIES RUNTIME_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/tests)
  probeview_use_compiled_headers(${name})
  # PRE_TEST: the tests are listed when ctest runs, so that a build does not run programs.
  gtest_discover_tests(${name} TEST_PREFIX "${name}." DISCOVERY_MODE PRE_TEST DISCOVERY_TIMEOUT 60
    WORKING_DIRECTORY ${PROJECT_SOURCE_DIR}
    PROPERTIES TIMEOUT 120 ENVIRONMENT "${ARG_ENVIRONMENT}")
endfunction()
