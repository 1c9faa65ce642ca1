# Options that every target of the project is compiled with, as the interface target
# secpolicy_options.

find_program(CCACHE_PROGRAM ccache)
if(CCACHE_PROGRAM AND NOT DEFINED CMAKE_CXX_COMPILER_LAUNCHER)
  set(CMAKE_CXX_COMPILER_LAUNCHER ${CCACHE_PROGRAM})
endif()

add_library(secpolicy_options INTERFACE)
target_compile_features(secpolicy_options INTERFACE cxx_std_20)
target_compile_options(secpolicy_options INTERFACE
  -Wall -Wextra -Wpedantic -Wshadow -Wconversion -Wnon-virtual-dtor -Woverloaded-virtual)

if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU" AND CMAKE_CXX_COMPILER_VERSION VERSION_LESS 13)
  # Optimising, GCC 12 takes `"literal" + std::string()` for overlapping memory.
  target_compile_options(secpolicy_options INTERFACE -Wno-restrict)
endif()

if(SECPOLICY_WERROR)
  target_compile_options(secpolicy_options INTERFACE -Werror)
endif()

# Linking the tests again takes most of the time of building after a change. Only programs are linked
# by another linker: the libraries stay what they are elsewhere. It has to take members out of archives
# in the order of the command line, as ld does, because some tests replace functions of the C library.
if(SECPOLICY_LINKER)
  include(CheckLinkerFlag)
  set(linker_option -fuse-ld=${SECPOLICY_LINKER})
  check_linker_flag(CXX ${linker_option} SECPOLICY_LINKS_WITH_${SECPOLICY_LINKER})
  if(SECPOLICY_LINKS_WITH_${SECPOLICY_LINKER})
    target_link_options(secpolicy_options INTERFACE
      $<$<STREQUAL:$<TARGET_PROPERTY:TYPE>,EXECUTABLE>:${linker_option}>)
  endif()
endif()

if(SECPOLICY_SANITIZE)
  # A finding ends the test that made it instead of being a line that nobody reads.
  target_compile_options(secpolicy_options INTERFACE
    -fsanitize=${SECPOLICY_SANITIZE} -fno-sanitize-recover=all -fno-omit-frame-pointer)
  target_link_options(secpolicy_options INTERFACE -fsanitize=${SECPOLICY_SANITIZE})
  if(SECPOLICY_SANITIZE MATCHES address)
    # Compilers say so in different ways.
    target_compile_definitions(secpolicy_options INTERFACE SECPOLICY_ADDRESS_SANITIZER)
  endif()
endif()

if(SECPOLICY_COVERAGE)
  if(NOT CMAKE_CXX_COMPILER_ID STREQUAL "Clang")
    # It counts what stands in the source; others count the edges that they make for exceptions too.
    message(FATAL_ERROR "SECPOLICY_COVERAGE needs Clang")
  endif()
  target_compile_options(secpolicy_options INTERFACE
    -fprofile-instr-generate -fcoverage-mapping -fprofile-update=atomic)
  target_link_options(secpolicy_options INTERFACE -fprofile-instr-generate)
  add_library(secpolicy_coverage OBJECT ${PROJECT_SOURCE_DIR}/tests/coverage/counts_outside.cc)
endif()

# What a program needs besides its own sources in such a build.
function(secpolicy_count_coverage target)
  if(SECPOLICY_COVERAGE)
    target_link_libraries(${target} PRIVATE secpolicy_coverage)
  endif()
endfunction()

# What fuzz targets are made of is instrumented for libFuzzer, and quick enough for it. The rest of the
# build is not: optimising and instrumenting the tests takes twice the time of compiling them.
function(secpolicy_instrument_for_fuzzing target)
  if(SECPOLICY_FUZZ)
    target_compile_options(${target} PRIVATE -O1 -fsanitize=fuzzer-no-link)
  endif()
endfunction()

include(${CMAKE_CURRENT_LIST_DIR}/Hardening.cmake)
