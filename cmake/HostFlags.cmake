# SPDX-License-Identifier: MIT OR GPL-2.0-only
# How everything that runs on the host is compiled: board, tools, tests. Optimised, g++ 12 takes "x" + std::string for
# a copy onto itself: no -Wrestrict.
add_library(pmx_host INTERFACE)
target_compile_features(pmx_host INTERFACE cxx_std_20)
target_compile_options(pmx_host INTERFACE
    -Werror -Wall -Wextra -Wpedantic -Wshadow -Wundef -Wformat=2 -Wcast-qual -Wpointer-arith -Wvla
    "$<$<COMPILE_LANGUAGE:CXX>:-Wnon-virtual-dtor;-Woverloaded-virtual;-Wextra-semi>"
    $<$<COMPILE_LANG_AND_ID:CXX,GNU>:-Wno-restrict> -fno-pie)
# What a source hides of another one that is compiled with it is no fault.
set(is_batched "$<COMPILE_LANGUAGE:CXX>,$<BOOL:$<TARGET_PROPERTY:UNITY_BUILD>>")
target_compile_options(pmx_host INTERFACE
    "$<$<AND:${is_batched}>:-Wno-shadow>"
    "$<$<AND:${is_batched},$<CXX_COMPILER_ID:GNU>>:-Wshadow=local;-Wno-subobject-linkage>")
# A compiler that collects its garbage late is done a twelfth sooner; two of them take a gigabyte more at most.
target_compile_options(pmx_host INTERFACE
    "$<$<COMPILE_LANG_AND_ID:CXX,GNU>:--param=ggc-min-heapsize=524288>")
# What is handed to others does not tell where it was made, in debug information neither.
target_compile_options(pmx_host INTERFACE
    "$<$<CONFIG:Release,RelWithDebInfo,MinSizeRel>:-ffile-prefix-map=${PROJECT_SOURCE_DIR}/=>"
    "$<$<CONFIG:Release,RelWithDebInfo,MinSizeRel>:-ffile-prefix-map=${PROJECT_BINARY_DIR}=build>")
if(CMAKE_CROSSCOMPILING)
    # All of a program comes of one compiler: that it once passed some parameters otherwise is of no interest.
    target_compile_options(pmx_host INTERFACE -Wno-psabi)
endif()
# The layer is position-dependent code; record_view finds its private objects by their addresses in the symbol table.
target_link_options(pmx_host INTERFACE -no-pie)
target_compile_definitions(pmx_host INTERFACE PMX_SOURCE_DIR="${PROJECT_SOURCE_DIR}")
target_include_directories(pmx_host INTERFACE ${PROJECT_SOURCE_DIR})
target_link_libraries(pmx_host INTERFACE pmx_headers)

# Who builds the fuzz targets elsewhere has compiler flags of his own, and an engine.
set(PMX_FUZZ_FLAGS "-fsanitize=fuzzer-no-link,address,undefined -fno-sanitize-recover=all -fno-omit-frame-pointer"
    CACHE STRING "What a build for fuzzing is compiled and linked with")
set(PMX_FUZZ_ENGINE -fsanitize=fuzzer CACHE STRING "What a fuzz target is linked with")

set(PMX_SANITIZE_FLAGS "")
if(PMX_SANITIZE)
    set(sanitizers address,undefined)
    if(CMAKE_CROSSCOMPILING)
        # What differs on the target are widths and alignments. Memory is looked after in the host's build: under an
        # emulator AddressSanitizer fails its own checks where a test forks.
        set(sanitizers undefined)
    endif()
    set(PMX_SANITIZE_FLAGS -fsanitize=${sanitizers} -fno-sanitize-recover=all -fno-omit-frame-pointer)
    if(PMX_SANITIZE STREQUAL FUZZ)
        separate_arguments(PMX_SANITIZE_FLAGS UNIX_COMMAND "${PMX_FUZZ_FLAGS}")
    endif()
    if(NOT PMX_SANITIZE STREQUAL LAYER)
        target_compile_options(pmx_host INTERFACE ${PMX_SANITIZE_FLAGS})
        if(PMX_SANITIZE STREQUAL FUZZ)
            # A call at every comparison takes up to half of the time, and what is compared there are words, which the
            # dictionaries have. The layer, which compares numbers, has the calls.
            target_compile_options(pmx_host INTERFACE $<$<CXX_COMPILER_ID:Clang>:-fno-sanitize-coverage=trace-cmp>)
        else()
            # What is looked for at every access to a member costs a quarter of the compile, and finds nothing that
            # AddressSanitizer or the processor does not stop at. The layer, and the fuzz targets, have it all.
            target_compile_options(pmx_host INTERFACE -fno-sanitize=null,alignment,object-size,vptr)
        endif()
    endif()
    target_link_options(pmx_host INTERFACE ${PMX_SANITIZE_FLAGS})
endif()

# Tests are looked after as far as they hand memory to what is tested: their variables have red zones, and their own
# accesses are checked by calls, which are compiled sooner than checks in place. Behind the flags of pmx_host.
add_library(pmx_test_flags INTERFACE)
if(PMX_SANITIZE STREQUAL ON AND CMAKE_CXX_COMPILER_ID STREQUAL GNU)
    target_compile_options(pmx_test_flags INTERFACE -g1 -O0 -fno-sanitize=undefined
        --param=asan-instrumentation-with-call-threshold=0)
endif()

# Half a hundred programs of a debug build are linked with the faster linker, where it is there. What others get is
# linked by the compiler's own, and so is what has PMX_OWN_LINKER.
if(PMX_SANITIZE STREQUAL ON)
    find_program(PMX_LLD ld.lld)
    if(PMX_LLD)
        target_link_options(pmx_host INTERFACE $<$<NOT:$<BOOL:$<TARGET_PROPERTY:PMX_OWN_LINKER>>>:-fuse-ld=lld>)
    endif()
endif()

# What tests run of board and tool is counted by clang, in a build of its own. It warns of nothing: other builds do.
option(PMX_COVERAGE "Count what the tests run of board and tool; clang alone can" OFF)
set(PMX_COVERAGE_FLAGS "")
if(PMX_COVERAGE)
    set(PMX_COVERAGE_FLAGS -fprofile-instr-generate -fcoverage-mapping -w)
    add_library(pmx_counted_exit STATIC ${PROJECT_SOURCE_DIR}/tests/coverage/counted_exit.c)
    target_compile_options(pmx_host INTERFACE ${PMX_COVERAGE_FLAGS})
    target_link_options(pmx_host INTERFACE -fprofile-instr-generate LINKER:--wrap=_exit)
    target_link_libraries(pmx_host INTERFACE pmx_counted_exit)
endif()

# Sources that are compiled together, so that the headers that all of them include are read once.
# Two sources of a library must not give the same name to two things, then, wherever they stand.
set(PMX_BATCH 24 CACHE STRING "Sources of board, tool and tests that are compiled together; 1: each alone")

function(pmx_in_batches name)
    if(PMX_BATCH GREATER 1)
        set_target_properties(${name} PROPERTIES UNITY_BUILD ON UNITY_BUILD_BATCH_SIZE ${PMX_BATCH})
    endif()
endfunction()

# A first run waits for the compiler: with -O1 it takes two thirds of the time that -O3 takes, and what it makes runs a
# twentieth longer. What has much to compute says so itself, behind this.
function(pmx_soon_compiled name)
    if(CMAKE_CROSSCOMPILING)
        target_compile_options(${name} PRIVATE -O2)   # what runs often under the emulator; tests need not
    else()
        target_compile_options(${name} PRIVATE $<$<CONFIG:Release>:-O1>)
    endif()
endfunction()

# A static library of the C++ sources of the given directories, but for a program's main.cpp.
function(pmx_host_library name)
    set(sources "")
    foreach(directory ${ARGN})
        pmx_files(found ${directory}/*.cpp)
        list(APPEND sources ${found})
    endforeach()
    list(FILTER sources EXCLUDE REGEX "/main\\.cpp$")
    add_library(${name} STATIC ${sources})
    target_include_directories(${name} PUBLIC ${ARGN})
    target_link_libraries(${name} PUBLIC pmx_host)
    pmx_in_batches(${name})
    pmx_soon_compiled(${name})
endfunction()
