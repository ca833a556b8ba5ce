# SPDX-License-Identifier: Apache-2.0
# Settings that hold for every target.
set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_EXPORT_COMPILE_COMMANDS ON)
set(CMAKE_RUNTIME_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/bin)

find_program(PROBEVIEW_CCACHE ccache)
if(PROBEVIEW_CCACHE AND NOT CMAKE_CXX_COMPILER_LAUNCHER)
  set(CMAKE_CXX_COMPILER_LAUNCHER ${PROBEVIEW_CCACHE})
  # Compiled headers are kept in the cache only by who promises that they hold no time of day.
  if(PROBEVIEW_COMPILED_HEADERS)
    list(PREPEND CMAKE_CXX_COMPILER_LAUNCHER ${CMAKE_COMMAND} -E env CCACHE_SLOPPINESS=pch_defines,time_macros)
  endif()
endif()

# Linking some sixty test programs is a good part of a build; mold does it several times as fast as the default linker.
# A compiler for another processor looks for a linker of its own and finds no mold.
find_program(PROBEVIEW_MOLD mold)
if(PROBEVIEW_MOLD AND NOT CMAKE_CROSSCOMPILING)
  add_link_options(-fuse-ld=mold)
endif()

# A build that begins anew spends its time on the same headers and templates again and again. The builds that nobody works
# in compile each room as a few large files instead; in the everyday build a changed file costs that file alone, and each
# file must name every header that it uses.
if(PROBEVIEW_QUICK_COLD)
  set(CMAKE_UNITY_BUILD ON)
endif()

find_package(Threads REQUIRED)

# One interface target carries the warnings, the include root and the sanitizers.
add_library(probeview_settings INTERFACE)
target_include_directories(probeview_settings INTERFACE ${PROJECT_SOURCE_DIR})
target_compile_options(probeview_settings INTERFACE
  -Wall -Wextra -Wpedantic -Wshadow -Wconversion -Werror -fno-omit-frame-pointer)
target_compile_definitions(probeview_settings INTERFACE PROBEVIEW_VERSION="${PROJECT_VERSION}")

set(PROBEVIEW_SANITIZE "" CACHE STRING "Sanitizers, as in -fsanitize=")
if(PROBEVIEW_SANITIZE)
  add_compile_options(-fsanitize=${PROBEVIEW_SANITIZE} -fno-sanitize-recover=all)
  add_link_options(-fsanitize=${PROBEVIEW_SANITIZE})
  # The checks that the sanitizers put in hide from g++ what the code around them has set, so that it warns of members of
  # an empty std::optional. The builds without sanitizers keep the warning.
  if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU")
    target_compile_options(probeview_settings INTERFACE -Wno-maybe-uninitialized)
  endif()
endif()
