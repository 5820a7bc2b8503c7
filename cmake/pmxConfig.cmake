# SPDX-License-Identifier: MIT OR GPL-2.0-only
# find_package(pmx 1): pmx::layer is the object that ships, with its headers; pmx::board the virtual board under it, for
# programs in C and C++. Whoever has no use for one of them names the other: COMPONENTS layer.
get_filename_component(PMX_PREFIX "${CMAKE_CURRENT_LIST_DIR}" REALPATH)   # /lib may be a link to /usr/lib
get_filename_component(PMX_PREFIX "${PMX_PREFIX}/../../.." ABSOLUTE)

if(NOT pmx_FIND_COMPONENTS)
    set(pmx_FIND_COMPONENTS layer board)
    set(pmx_FIND_REQUIRED_layer TRUE)
    set(pmx_FIND_REQUIRED_board TRUE)
endif()

set(pmx_layer_FOUND TRUE)
if(NOT TARGET pmx::layer)
    add_library(pmx::layer OBJECT IMPORTED)
    set_target_properties(pmx::layer PROPERTIES
        IMPORTED_OBJECTS "${PMX_PREFIX}/lib/pmx/pmx_if.o"
        INTERFACE_INCLUDE_DIRECTORIES "${PMX_PREFIX}/include/pmx"
        INTERFACE_COMPILE_OPTIONS $<$<COMPILE_LANGUAGE:C>:-fno-short-enums>
        INTERFACE_LINK_OPTIONS -no-pie)
endif()

# The board is C++ inside. A project without that language links the library by name, for it has no compiler to do so.
if(board IN_LIST pmx_FIND_COMPONENTS)
    find_package(Threads QUIET)
    find_library(PMX_TOML_LIBRARY tomlplusplus)
    find_library(PMX_PIXMAN_LIBRARY pixman-1)
    find_library(PMX_PNG_LIBRARY png)
    mark_as_advanced(PMX_TOML_LIBRARY PMX_PIXMAN_LIBRARY PMX_PNG_LIBRARY)
    set(pmx_board_FOUND FALSE)
    if(NOT Threads_FOUND)
        set(pmx_NOT_FOUND_MESSAGE "pmx::board needs threads.")
    elseif(NOT PMX_TOML_LIBRARY)
        set(pmx_NOT_FOUND_MESSAGE "pmx::board needs the library tomlplusplus (Debian: libtomlplusplus-dev).")
    elseif(NOT PMX_PIXMAN_LIBRARY)
        set(pmx_NOT_FOUND_MESSAGE "pmx::board needs the library pixman (Debian: libpixman-1-dev).")
    elseif(NOT PMX_PNG_LIBRARY)
        set(pmx_NOT_FOUND_MESSAGE "pmx::board needs the library libpng (Debian: libpng-dev).")
    else()
        set(pmx_board_FOUND TRUE)
    endif()
    if(pmx_board_FOUND AND NOT TARGET pmx::board)
        add_library(pmx::board STATIC IMPORTED)
        set_target_properties(pmx::board PROPERTIES
            IMPORTED_LOCATION "${PMX_PREFIX}/lib/pmx/libpmx_board.a"
            INTERFACE_LINK_LIBRARIES
                "${PMX_TOML_LIBRARY};${PMX_PIXMAN_LIBRARY};${PMX_PNG_LIBRARY};stdc++;m;Threads::Threads"
            INTERFACE_LINK_OPTIONS "-no-pie;LINKER:@${PMX_PREFIX}/lib/pmx/recorded_calls.txt"
            INTERFACE_INCLUDE_DIRECTORIES "${PMX_PREFIX}/include/pmx")
        get_property(languages GLOBAL PROPERTY ENABLED_LANGUAGES)
        if(CXX IN_LIST languages)
            set_target_properties(pmx::board PROPERTIES INTERFACE_COMPILE_FEATURES cxx_std_20)
        endif()
    endif()
endif()

foreach(component ${pmx_FIND_COMPONENTS})
    if(NOT pmx_${component}_FOUND AND pmx_FIND_REQUIRED_${component})
        set(pmx_FOUND FALSE)
        if(NOT pmx_NOT_FOUND_MESSAGE)
            set(pmx_NOT_FOUND_MESSAGE "pmx has no component ${component}; there are: layer, board.")
        endif()
    endif()
endforeach()
