# SPDX-License-Identifier: MIT OR GPL-2.0-only
# find_package(pmx): pmx::layer is the object that ships, with its headers; pmx::board the virtual board under it.
get_filename_component(PMX_PREFIX ${CMAKE_CURRENT_LIST_DIR}/../../.. ABSOLUTE)

find_package(Threads REQUIRED)   # the board's

if(NOT TARGET pmx::layer)
    add_library(pmx::layer OBJECT IMPORTED)
    set_target_properties(pmx::layer PROPERTIES
        IMPORTED_OBJECTS ${PMX_PREFIX}/lib/pmx/pmx_if.o
        INTERFACE_INCLUDE_DIRECTORIES ${PMX_PREFIX}/include/pmx
        INTERFACE_COMPILE_OPTIONS $<$<COMPILE_LANGUAGE:C>:-fno-short-enums>
        INTERFACE_LINK_OPTIONS -no-pie)

    add_library(pmx::board STATIC IMPORTED)
    set_target_properties(pmx::board PROPERTIES
        IMPORTED_LOCATION ${PMX_PREFIX}/lib/pmx/libpmx_board.a
        IMPORTED_LINK_INTERFACE_LANGUAGES CXX
        INTERFACE_LINK_LIBRARIES "tomlplusplus;Threads::Threads"   # Debian's libtomlplusplus-dev
        INTERFACE_INCLUDE_DIRECTORIES ${PMX_PREFIX}/include/pmx)
endif()
