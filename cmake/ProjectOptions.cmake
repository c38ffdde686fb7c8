# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT

# project_options: what every target of the project compiles and links with.
add_library(project_options INTERFACE)
target_compile_features(project_options INTERFACE cxx_std_20 c_std_11)
target_compile_options(project_options INTERFACE
  -fvisibility=hidden $<$<COMPILE_LANGUAGE:CXX>:-fvisibility-inlines-hidden>
  -Wall -Wextra -Wpedantic -Wshadow -Wconversion -Wformat=2
  $<$<COMPILE_LANGUAGE:CXX>:-Wnon-virtual-dtor>
  $<$<BOOL:${MEDIIDX_WERROR}>:-Werror>)
# GCC's flow warnings misfire inside the sanitizers' own code.
if(MEDIIDX_SANITIZE)
  target_compile_options(project_options INTERFACE
    -fsanitize=${MEDIIDX_SANITIZE} -fno-sanitize-recover=all -fno-omit-frame-pointer
    $<$<CXX_COMPILER_ID:GNU>:-Wno-maybe-uninitialized>)
  target_link_options(project_options INTERFACE -fsanitize=${MEDIIDX_SANITIZE})
else()
  target_compile_options(project_options INTERFACE
    $<$<NOT:$<CONFIG:Debug>>:-D_FORTIFY_SOURCE=2>)
endif()
if(MEDIIDX_COVERAGE)
  target_compile_options(project_options INTERFACE -fprofile-instr-generate -fcoverage-mapping)
  target_link_options(project_options INTERFACE -fprofile-instr-generate)
endif()
find_program(MOLD mold)
if(MOLD)
  target_link_options(project_options INTERFACE -fuse-ld=mold)
endif()
find_program(CCACHE ccache)
if(CCACHE AND NOT CMAKE_CXX_COMPILER_LAUNCHER)
  set(CMAKE_C_COMPILER_LAUNCHER ${CCACHE})
  set(CMAKE_CXX_COMPILER_LAUNCHER ${CCACHE})
endif()
