# How our own code is compiled: the target lumenkey_settings holds what every target of the project links
# (never installed, never handed on to a host), and the sanitizers are switched on for the whole build.

find_program(LUMENKEY_CCACHE ccache)
mark_as_advanced(LUMENKEY_CCACHE)
if(LUMENKEY_CCACHE AND NOT DEFINED CMAKE_CXX_COMPILER_LAUNCHER)
    set(CMAKE_CXX_COMPILER_LAUNCHER "${LUMENKEY_CCACHE}")
endif()

set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_EXPORT_COMPILE_COMMANDS ON)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)

add_library(lumenkey_settings INTERFACE)
target_compile_features(lumenkey_settings INTERFACE cxx_std_20)
target_compile_options(lumenkey_settings INTERFACE
    -Wall -Wextra -Wconversion -Wshadow -Werror
    # Values are frozen to the last bit: no machine may fuse a product and a sum.
    -ffp-contract=off)
# GCC 12 takes the standard library's own string concatenation for an overlapping copy
# (https://gcc.gnu.org/PR105651).
if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU" AND CMAKE_CXX_COMPILER_VERSION VERSION_LESS 13)
    target_compile_options(lumenkey_settings INTERFACE -Wno-restrict)
endif()

if(LUMENKEY_SANITIZE STREQUAL "address")
    set(sanitizer_options -fsanitize=address,undefined -fno-sanitize-recover=all -fno-omit-frame-pointer)
elseif(LUMENKEY_SANITIZE STREQUAL "thread")
    set(sanitizer_options -fsanitize=thread -fno-omit-frame-pointer)
elseif(LUMENKEY_SANITIZE STREQUAL "none")
    set(sanitizer_options)
else()
    message(FATAL_ERROR "LUMENKEY_SANITIZE is '${LUMENKEY_SANITIZE}'; it takes none, address or thread")
endif()
if(LUMENKEY_BUILD_FUZZERS)
    list(APPEND sanitizer_options -fsanitize=fuzzer-no-link)
endif()
add_compile_options(${sanitizer_options})
add_link_options(${sanitizer_options})
