# SPDX-License-Identifier: MIT OR GPL-2.0-only
# pmx_host_headers(<target> <directory>): a library of headers alone, in a directory of /usr/include, for a cross
# compiler. It gets that directory and no other: the host's C library stays out of its sight.
function(pmx_host_headers target directory)
    if(TARGET ${target})
        return()
    endif()
    if(NOT EXISTS /usr/include/${directory})
        message(FATAL_ERROR "${target}: /usr/include/${directory} is missing: ./dev setup installs it")
    endif()
    set(headers ${CMAKE_BINARY_DIR}/host_headers)
    file(MAKE_DIRECTORY ${headers})
    file(CREATE_LINK /usr/include/${directory} ${headers}/${directory} SYMBOLIC)
    add_library(${target} INTERFACE IMPORTED)
    target_include_directories(${target} INTERFACE ${headers})
endfunction()
