# SPDX-License-Identifier: Apache-2.0
# What nearly every file includes, compiled once: reading the standard library's headers is half of what a file of ours
# costs the compiler. Headers of the system only, so that no change of ours makes them anew. A file still has to name
# what it uses: the presets bench, clang and coverage compile each file without them.
#
#   probeview_compile_headers(NAME LINKS library… HEADERS header…)   compiles them for who has the same compiler options
#   probeview_use_compiled_headers(TARGET)       lets a target use those that probeview_compiled_headers names, which is
#                                                set by folder
include_guard()

if(PROBEVIEW_COMPILED_HEADERS AND CMAKE_CXX_COMPILER_ID STREQUAL "GNU")
  add_compile_options(-fpch-preprocess)  # else ccache does not see what the compiled headers stand for
  # Optimising, g++ 12 warns of code of the standard library that it believes it has seen overrun, and keeps that to
  # itself only where it has read the library's headers in the same run. Builds without compiled headers keep these.
  target_compile_options(probeview_settings INTERFACE
    $<$<CONFIG:Release>:-Wno-array-bounds> $<$<CONFIG:Release>:-Wno-restrict> $<$<CONFIG:Release>:-Wno-stringop-overflow>)
endif()

function(probeview_compile_headers name)
  cmake_parse_arguments(ARG "" "" "LINKS;HEADERS" ${ARGN})
  if(NOT PROBEVIEW_COMPILED_HEADERS)
    return()
  endif()
  file(CONFIGURE OUTPUT ${CMAKE_CURRENT_BINARY_DIR}/${name}.cpp CONTENT "// nothing but the headers\n")
  add_library(${name} OBJECT ${CMAKE_CURRENT_BINARY_DIR}/${name}.cpp)
  target_link_libraries(${name} PRIVATE probeview_settings ${ARG_LINKS})
  target_precompile_headers(${name} PRIVATE ${ARG_HEADERS})
endfunction()

function(probeview_use_compiled_headers target)
  get_target_property(libraries ${target} LINK_LIBRARIES)
  # Qt asks for position-independent code, which compiled headers must have been made for; what uses it has its own.
  if(TARGET ${probeview_compiled_headers} AND NOT libraries MATCHES "Qt6::|pv_ui_qt")
    target_precompile_headers(${target} REUSE_FROM ${probeview_compiled_headers})
  endif()
endfunction()

set(probeview_standard_headers
  <algorithm> <array> <charconv> <chrono> <cstdint> <deque> <functional> <limits> <map> <memory> <optional> <set> <span>
  <string> <string_view> <utility> <variant> <vector>)
probeview_compile_headers(probeview_headers HEADERS ${probeview_standard_headers})
set(probeview_compiled_headers probeview_headers)
