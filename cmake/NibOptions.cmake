# What a user of the build may choose; everything else is fixed.
option(NIB_BUILD_TESTS "Build the tests" ${PROJECT_IS_TOP_LEVEL})
option(NIB_BUILD_TOOLS "Build the command-line tool nib" ${PROJECT_IS_TOP_LEVEL})
option(NIB_BUILD_EXAMPLES "Build the examples" ${PROJECT_IS_TOP_LEVEL})
option(NIB_BUILD_BENCH "Build the benchmarks" OFF)
option(NIB_BUILD_FUZZERS "Build the fuzzers (Clang only)" OFF)
option(NIB_FUZZ_COVERAGE "Let the fuzzers see which of the library's code they reach" OFF)
option(NIB_INSTALL "Generate install rules" ${PROJECT_IS_TOP_LEVEL})
option(NIB_TEST_ALL_DRIVERS "Test further EGL drivers, those that docs/drivers.md lists" OFF)
option(NIB_WERROR "Treat warnings as errors" ON)
set(NIB_SANITIZE "" CACHE STRING "Sanitizers to build with: address,undefined or thread")

set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_EXPORT_COMPILE_COMMANDS ON)

if(ANDROID)
    set(NIB_PLATFORM android)
else()
    set(NIB_PLATFORM linux)
endif()

find_program(NIB_CCACHE ccache)
if(NIB_CCACHE AND NOT CMAKE_CXX_COMPILER_LAUNCHER)
    # Paths relative to the source tree, so that two checkouts share their objects.
    set(CMAKE_CXX_COMPILER_LAUNCHER
        ${CMAKE_COMMAND} -E env CCACHE_BASEDIR=${CMAKE_CURRENT_SOURCE_DIR} CCACHE_NOHASHDIR=1 ${NIB_CCACHE})
endif()

# Warnings, and the floating-point rule: no fused multiply-add, so that results are the same on every
# processor.
add_library(NibBuildFlags INTERFACE)
target_compile_options(NibBuildFlags INTERFACE
    -Wall -Wextra -Wpedantic -Wshadow -Wnon-virtual-dtor -Wformat=2 -Wno-format-nonliteral
    -ffp-contract=off
    $<$<BOOL:${NIB_WERROR}>:-Werror>
    $<$<CXX_COMPILER_ID:Clang>:-Wthread-safety -Wthread-safety-beta>)
if(ANDROID)
    # Devices with pages of 16 KiB load only libraries whose segments are aligned to them.
    target_link_options(NibBuildFlags INTERFACE -Wl,-z,max-page-size=16384)
endif()
if(NIB_SANITIZE)
    target_compile_options(NibBuildFlags INTERFACE
        -fsanitize=${NIB_SANITIZE} -fno-sanitize-recover=all -fno-omit-frame-pointer)
    target_link_options(NibBuildFlags INTERFACE -fsanitize=${NIB_SANITIZE})
endif()
if(NIB_FUZZ_COVERAGE)
    target_compile_options(NibBuildFlags INTERFACE -fsanitize=fuzzer-no-link)
    target_link_options(NibBuildFlags INTERFACE -fsanitize=fuzzer-no-link)
endif()
